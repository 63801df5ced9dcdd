#include "engine/install_pass.h"

#include <new>

#include "engine/package_walk.h"
#include "package/expand_stream.h"
#include "package/paths.h"
#include "platform/text.h"
#include "ui/catalog.h"

namespace {

class InstallPass {
 public:
  static constexpr bool kAddsEvents = true;
  static constexpr bool kTakesStreams = true;

  explicit InstallPass(SetupContext* context) : context_(context) {}

  StatusCode Begin() {
    context_->records = new (std::nothrow) FileRecord[context_->header.recordCount]();
    if (context_->records != nullptr) return StatusOk;
    ClosePackageFile(context_);
    return GiveUp(&context_->events, EventNoMemory, nullptr, StatusNoMemory);
  }

  FileRecord* RecordAt(int index) { return &context_->records[index]; }

  StatusCode Work(const FileRecord& record, const TargetList& targets) {
    return InstallTargets(context_, &targets, record.storedSize);
  }

 private:
  SetupContext* context_;
};

// Makes way for a file and names it to the user.
StatusCode PrepareTarget(SetupContext* context, const char* path) {
  const bool replaces = FileExists(path) == 1;
  if (replaces && DeleteFileChecked(path) != 1) {
    return GiveUp(&context->events, EventDeleteFailed, path, StatusDeleteFailed);
  }
  ShowMessage(context, replaces ? CatalogUpdatingFile : CatalogCopyingFile, path);
  const StatusCode status = MakeDirectories(path);
  return status == StatusOk ? status : GiveUp(&context->events, EventNoDirectory, path, status);
}

}  // namespace

StatusCode InstallFiles(SetupContext* context) {
  if (context == nullptr || context->packageFile == nullptr) return StatusInternal;
  InstallPass pass(context);
  return WalkPackage(context, pass);
}

StatusCode InstallTargets(SetupContext* context, const TargetList* list, uint32_t storedSize) {
  if (context == nullptr || context->packageFile == nullptr || list == nullptr ||
      list->entries == nullptr || storedSize == 0) {
    return StatusInternal;
  }
  for (int32_t i = 0; i < list->count; ++i) {
    const char* const path = list->entries[i].path;
    StatusCode status = PrepareTarget(context, path);
    if (status != StatusOk) return status;
    if (i == 0) {
      status = ExpandStream(context->packageFile, path, storedSize);
      if (status != StatusOk) return GiveUp(&context->events, EventExpandFailed, path, status);
    } else {
      status = CopyTarget(list->entries[0].path, path);
      if (status != StatusOk) return GiveUp(&context->events, EventCopyFailed, path, status);
    }
    Inform(&context->events, EventFileCopied, path);
  }
  return StatusOk;
}

StatusCode CopyTarget(const char* source, const char* target) {
  if (IsMissingOrEmpty(source) || IsMissingOrEmpty(target)) return StatusInternal;
  return CopyFileA(source, target, FALSE) != FALSE ? StatusOk : StatusCopyFailed;
}

StatusCode MakeDirectories(const char* path) {
  constexpr size_t kShortestPath = 4;
  if (path == nullptr || strlen(path) < kShortestPath) return StatusInternal;
  char directory[kPathSize] = {};
  for (const char* end = path; *end != '\0'; ++end) {
    if (*end != '\\') continue;
    const size_t length = static_cast<size_t>(end - path);
    if (length >= sizeof(directory)) return StatusCreateDirFailed;
    memcpy(directory, path, length);
    directory[length] = '\0';
    const DWORD attributes = GetFileAttributesA(directory);
    if (attributes != INVALID_FILE_ATTRIBUTES && (attributes & FILE_ATTRIBUTE_DIRECTORY) != 0) {
      continue;
    }
    SECURITY_ATTRIBUTES security = {sizeof(security), nullptr, TRUE};
    if (CreateDirectoryA(directory, &security) == FALSE) return StatusCreateDirFailed;
  }
  return StatusOk;
}
