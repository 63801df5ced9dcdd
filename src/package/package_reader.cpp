#include "package/package_reader.h"

#include <cstring>
#include <new>

#include "package/paths.h"
#include "platform/text.h"

namespace {

StatusCode RefusePackage(SetupContext* context, const char* path, uint32_t event,
                         StatusCode status) {
  ClosePackageFile(context);
  return GiveUp(&context->events, event, path, status);
}

bool IsGoodHeader(const PackageHeader& header) {
  return header.headerSize == sizeof(PackageHeader) &&
         memcmp(header.magic, kPackageMagic, sizeof(header.magic)) == 0;
}

}  // namespace

StatusCode OpenPackage(SetupContext* context) {
  if (context == nullptr) return StatusBadPackage;
  const StatusCode status = InitEventList(&context->events);
  return status == StatusOk ? ReadPackageHeader(context) : status;
}

StatusCode ReadPackageHeader(SetupContext* context) {
  if (context == nullptr) return StatusBadPackage;
  char path[kPathSize] = {};
  if (GetImagePath(path, sizeof(path)) != StatusOk) {
    return GiveUp(&context->events, EventNoImagePath, nullptr, StatusInternal);
  }
  DataFile* file = new (std::nothrow) DataFile(path);
  if (file == nullptr) return StatusNoMemory;
  context->packageFile = file;
  if (file->OpenForRead() != 1) {
    return RefusePackage(context, path, EventOpenFailed, StatusOpenFailed);
  }

  // A file shorter than a header gives a negative position, and one of 2 GiB or more gives one that
  // has no 32-bit form: both are seeks that fail.
  const int64_t position = static_cast<int64_t>(file->GetSize()) - int64_t{sizeof(PackageHeader)};
  if (position > INT32_MAX || file->SeekTo(static_cast<int32_t>(position)) != 1) {
    return RefusePackage(context, path, EventSeekFailed, StatusBadPackage);
  }
  context->header = {};
  if (file->Read(&context->header, sizeof(PackageHeader)) != sizeof(PackageHeader) ||
      !IsGoodHeader(context->header)) {
    return RefusePackage(context, path, EventBadPackage, StatusBadPackage);
  }
  return StatusOk;
}

int32_t ReadFileRecord(DataFile* file, FileRecord* record) {
  if (file == nullptr || record == nullptr) return StatusBadArgument;
  if (file->Read(record, sizeof(FileRecord)) != sizeof(FileRecord)) return 0;
  return record->recordSize == sizeof(FileRecord) ? int32_t{sizeof(FileRecord)} : 0;
}

StatusCode GetImagePath(char* buffer, uint32_t size) {
  if (buffer == nullptr || size == 0) return StatusBadArgument;
  const DWORD length = GetModuleFileNameA(ModuleHandle(), buffer, size);
  // A path that is cut names another file. The answer is then the size, and systems before Windows
  // Vista put no NUL.
  if (length > 0 && length < size && buffer[0] != '\0') return StatusOk;
  buffer[0] = '\0';
  return StatusNoModulePath;
}

void ClosePackageFile(SetupContext* context) {
  delete context->packageFile;
  context->packageFile = nullptr;
}

StatusCode ReleasePackage(SetupContext* context) {
  if (context == nullptr) return StatusBadArgument;
  ClosePackageFile(context);
  delete[] context->records;
  context->records = nullptr;
  return StatusOk;
}

StatusCode CloseSetup(SetupContext* context) {
  if (context == nullptr) return StatusBadArgument;
  (void)FreeEventList(&context->events);
  return ReleasePackage(context);
}
