#include "engine/update_check.h"

#include "engine/file_version.h"
#include "engine/package_walk.h"
#include "package/paths.h"

namespace {

class UpdateCheck {
 public:
  static constexpr bool kReports = false;
  static constexpr bool kTakesStreams = false;

  FileRecord* RecordAt(int) {
    packaged_ = {};
    return &packaged_;
  }

  // 0, which ends the walk, at the first target that is missing or older.
  StatusCode Work(const FileRecord& record, const TargetList& targets) {
    for (int32_t i = 0; i < targets.count && !foundOlder_; ++i) {
      foundOlder_ = IsMissingOrOlder(targets.entries[i].path, record);
    }
    return foundOlder_ ? 0 : StatusOk;
  }

  bool foundOlder() const { return foundOlder_; }

 private:
  static bool IsMissingOrOlder(const char* path, const FileRecord& packaged) {
    if (FileExists(path) != 1) return true;
    FileRecord installed = {};
    // Unread: a file without a version leaves fields that compare as older than any version.
    (void)ReadFileRecordFromDisk(path, &installed);
    memcpy(installed.fileName, packaged.fileName, sizeof(installed.fileName));
    memcpy(installed.destination, packaged.destination, sizeof(installed.destination));
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
    (void)AddEvent(&context->events, EventOlderFound, SeverityInformation, nullptr);
    return 1;
  }
  return status == StatusOk || IsGivenUp(status) ? 0 : status;
}
