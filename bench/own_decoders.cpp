// The project's own decoders, fed as an install feeds them.
#include <algorithm>
#include <memory>
#include <string_view>

#include "bench/decoders.h"
#include "package/expander.h"
#include "tests/support/plain_expander.h"

#ifdef __GLIBC__
#include <malloc.h>
#endif

namespace {

constexpr size_t kBlockSize = 1024;

// Collects into pieces of 1024 bytes as for a file, and counts.
class CountingExpander : public PkzFileExpander {
 public:
  explicit CountingExpander(Output* output) : PkzFileExpander(nullptr), output_(output) {}

 protected:
  void WriteOutput(const uint8_t* bytes, uint32_t count) override {
    PkzFileExpander::WriteOutput(bytes, count);
    output_->Take(bytes, count);
  }

 private:
  Output* output_;
};

}  // namespace

bool DecodeByExpander(Bytes stream, Output* output) {
  const auto expander = std::make_unique<CountingExpander>(output);
  while (!stream.empty()) {
    const size_t count = std::min(stream.size(), kBlockSize);
    expander->ExpandBlock(stream.data(), static_cast<uint32_t>(count));
    stream = stream.subspan(count);
  }
  expander->Flush();
  return expander->failed() == 0;
}

bool DecodeByLetter(Bytes stream, Output* output) {
  const Bytes codes = stream.subspan(kStreamMagicSize);
  const PlainExpansion expansion = PlainExpander::Expand(
      std::string_view(reinterpret_cast<const char*>(codes.data()), codes.size()));
  output->Take(expansion.bytes.data(), expansion.bytes.size());
  return !expansion.failed;
}

uint64_t ExpanderMemory() {
#ifdef __GLIBC__
  const auto used = [] {
    const struct mallinfo2 info = mallinfo2();
    return info.uordblks + info.hblkhd;  // small blocks, and those mapped on their own
  };
  const size_t before = used();
  const auto expander = std::make_unique<PkzFileExpander>(nullptr);
  return used() - before;
#else
  return 0;
#endif
}
