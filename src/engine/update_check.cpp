#include "engine/update_check.h"

#include "engine/file_version.h"
#include "engine/package_walk.h"
#include "package/paths.h"

namespace {

class UpdateCheck {
 public:
  static constexpr bool kAddsEvents = false;
  static constexpr bool kTakesStreams = false;

  StatusCode Begin() { return StatusOk; }

  FileRecord* RecordAt(int) {
    packaged_ = {};
    return &packaged_;
  }

  // Ends the walk at the first target that is missing or older.
  StatusCode Work(const FileRecord& record, const TargetList& targets) {
    for (int32_t i = 0; i < targets.count && !foundOlder_; ++i) {
      foundOlder_ = IsMissingOrOlder(targets.entries[i].path, record);
    }
    return foundOlder_ ? kFound : StatusOk;
  }

  bool foundOlder() const { return foundOlder_; }

 private:
  static constexpr StatusCode kFound = 0;  // no status of the program's: ends the walk

  static bool IsMissingOrOlder(const char* path, const FileRecord& packaged) {
    if (FileExists(path) != 1) return true;
    FileRecord installed = {};
    // Unread: a file without a version leaves fields that compare as older than any version.
    (void)ReadFileRecordFromDisk(path, &installed);
    memcpy(installed.fileName, packaged.fileName, sizeof(installed.fileName));
    const RecordComparison comparison = CompareFileRecords(&packaged, &installed);
    return comparison == ComparisonFirstGreater || comparison == ComparisonSecondGreater ||
           comparison == ComparisonThirdGreater;
  }

  FileRecord packaged_ = {};
  bool foundOlder_ = false;
};

// The walk was given up without a verdict.
bool IsGivenUp(StatusCode status) {
  return status == StatusCancelled || status == StatusBadRecord || status == StatusReadFailed;
}

}  // namespace

int32_t DetectOlderFiles(SetupContext* context) {
  if (context == nullptr || context->packageFile == nullptr) return StatusBadArgument;
  UpdateCheck check;
  const StatusCode status = WalkPackage(context, check);
  if (check.foundOlder()) {
    Inform(&context->events, EventOlderFound);
    return 1;
  }
  return status == StatusOk || IsGivenUp(status) ? 0 : status;
}
