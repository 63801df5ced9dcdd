#include "package/expand_stream.h"

#include <memory>
#include <new>

#include "core/hooks.h"
#include "package/expander.h"
#include "platform/text.h"

namespace {

constexpr uint32_t kBlockSize = 1024;

StatusCode ExpandBlocks(DataFile* packageFile, uint32_t storedSize, PkzFileExpander* expander) {
  uint8_t block[kBlockSize];
  uint32_t left = storedSize;
  while (left > 0) {
    if (PollCancel() == 1) return StatusCancelled;
    const uint32_t count = left < kBlockSize ? left : kBlockSize;
    if (packageFile->Read(block, count) != count) return StatusReadFailed;
    expander->ExpandBlock(block, count);
    if (expander->failed() != 0) return StatusExpandFailed;
    left -= count;
  }
  if (expander->bufferFill() > 0) expander->Flush();
  return expander->failed() == 0 ? StatusOk : StatusExpandFailed;
}

}  // namespace

StatusCode ExpandStream(DataFile* packageFile, const char* path, uint32_t storedSize) {
  if (packageFile == nullptr || IsMissingOrEmpty(path) || storedSize == 0) return StatusInternal;
  const std::unique_ptr<DataFile> output(new (std::nothrow) DataFile(path));
  if (output == nullptr) return StatusNoMemory;
  if (output->Create() != 1) return StatusCreateFileFailed;

  // On the heap: the expander has the size of its longest string and two buffers, 37 KB.
  const std::unique_ptr<PkzFileExpander> expander(new (std::nothrow) PkzFileExpander(output.get()));
  const bool isReady = expander != nullptr && expander->IsReady();
  const StatusCode status =
      isReady ? ExpandBlocks(packageFile, storedSize, expander.get()) : StatusNoMemory;
  (void)output->Close();  // the bytes are out; the system's verdict on the handle changes nothing
  if (status != StatusOk) (void)output->Delete();  // no partial file stays
  return status;
}
