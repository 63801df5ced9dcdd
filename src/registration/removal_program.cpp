#include "registration/removal_program.h"

#include <memory>
#include <new>

#include "core/hooks.h"
#include "engine/file_version.h"
#include "package/package_reader.h"
#include "package/paths.h"
#include "platform/text.h"
#include "ui/catalog.h"

namespace {

constexpr uint32_t kBlockSize = 1024;

bool CopyExecutable(DataFile* image, uint32_t length, DataFile* copy) {
  uint8_t block[kBlockSize];
  while (length > 0) {
    const uint32_t count = length < kBlockSize ? length : kBlockSize;
    if (image->Read(block, count) != count || copy->Write(block, count) != count) return false;
    length -= count;
  }
  return true;
}

bool WriteRecords(FileRecord* records, uint16_t count, DataFile* copy) {
  for (uint16_t i = 0; i < count; ++i) {
    records[i].storedSize = 0;
    if (copy->Write(&records[i], sizeof(FileRecord)) != sizeof(FileRecord)) return false;
  }
  return true;
}

bool WriteHeader(PackageHeader* header, DataFile* copy) {
  header->removalImageFlag = 1;
  header->packageLength = header->recordCount * uint32_t{sizeof(FileRecord)};
  return copy->Write(header, sizeof(PackageHeader)) == sizeof(PackageHeader);
}

}  // namespace

bool FindRemovalProgramPath(char (&path)[kRemovalProgramPathSize]) {
  char name[sizeof(FileRecord::fileName)] = {};
  char directory[kPathSize] = {};
  LoadCatalogText(nullptr, CatalogRemovalProgram, name);
  return name[0] != '\0' && GetWindowsDir(directory, sizeof(directory)) == 1 &&
         FormatText(path, sizeof(path), "%s\\%s", directory, name);
}

StatusCode WriteRemovalProgram(SetupContext* context, char* path, int32_t size) {
  if (context == nullptr || context->packageFile == nullptr) return StatusBadArgument;
  DataFile* const image = context->packageFile;
  // Opened again below, it stands at its first byte: the copy begins with the executable. In
  // between another program can open it, or put another file in its place.
  (void)image->Close();

  FileRecord own = {};  // unread: an image without a version makes no removal program
  if (ReadOwnFileRecord(&own) != 1) return StatusBadRecord;
  char target[kRemovalProgramPathSize] = {};
  if (!FindRemovalProgramPath(target)) return StatusWriteRemovalFailed;
  if (path != nullptr && size > 0) (void)CopyText(path, static_cast<size_t>(size), target);

  const bool replaces = FileExists(target) == 1;
  if (replaces && DeleteFileChecked(target) != 1) return StatusDeleteFailed;
  ShowMessage(context, replaces ? CatalogUpdatingFile : CatalogCopyingFile, target);

  if (image->OpenForRead() != 1) return StatusOpenFailed;
  const std::unique_ptr<DataFile> copy(new (std::nothrow) DataFile(target));
  if (copy == nullptr) return StatusNoMemory;
  if (copy->Create() != 1) return StatusCreateFileFailed;
  if (!CopyExecutable(image, context->header.dataOffset, copy.get()) ||
      !WriteRecords(context->records, context->header.recordCount, copy.get()) ||
      !WriteHeader(&context->header, copy.get())) {
    (void)copy->Delete();  // no partial removal program stays
    return StatusWriteRemovalFailed;
  }
  return StatusOk;
}
