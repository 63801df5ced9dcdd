#include "engine/removal_pass.h"

#include "engine/package_walk.h"
#include "package/paths.h"
#include "ui/catalog.h"

namespace {

class RemovalPass {
 public:
  static constexpr bool kAddsEvents = true;
  static constexpr bool kTakesStreams = false;

  explicit RemovalPass(SetupContext* context) : context_(context) {}

  StatusCode Begin() { return StatusOk; }

  FileRecord* RecordAt(int) {
    record_ = {};
    return &record_;
  }

  StatusCode Work(const FileRecord&, const TargetList& targets) {
    for (int32_t i = 0; i < targets.count; ++i) RemoveTarget(targets.entries[i]);
    return StatusOk;
  }

  // Tries a directory and logs the attempt, whatever became of it.
  void TryDirectory(const char* path) {
    (void)RemoveDirectoryChecked(path);
    Inform(&context_->events, EventRemovingDirectory, path);
  }

 private:
  void RemoveTarget(const TargetEntry& target) {
    if (FileExists(target.path) != 1) return;
    ShowMessage(context_, CatalogDeletingFile, target.path);
    Inform(&context_->events, EventDeletingFile, target.path);
    (void)DeleteFileChecked(target.path);  // a file in use or read-only stays
    if (target.directory[0] != '\0') TryDirectory(target.directory);
  }

  SetupContext* context_;
  FileRecord record_ = {};
};

}  // namespace

StatusCode RemoveProductFiles(SetupContext* context) {
  if (context == nullptr || context->packageFile == nullptr) return StatusBadArgument;
  RemovalPass pass(context);
  const StatusCode status = WalkPackage(context, pass);
  if (status != StatusOk) return status;
  pass.TryDirectory(context->installDir);
  return StatusOk;
}
