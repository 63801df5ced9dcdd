#include "tools/planner/run_survey.h"

#include <cstring>

#include "core/command_line.h"
#include "core/run_settings.h"
#include "engine/file_version.h"
#include "engine/package_walk.h"
#include "log/event_log.h"
#include "machine/code_page.h"
#include "package/package_reader.h"
#include "package/paths.h"
#include "platform/text.h"
#include "registration/registered_product.h"
#include "registration/removal_program.h"

namespace image {
namespace {

std::string VersionText(const FileRecord& record) {
  std::string text;
  for (const int16_t field : {record.versionFirst, record.versionSecond, record.versionThird}) {
    if (field == kVersionNotSet) return {};
    if (!text.empty()) text += '.';
    text += std::to_string(field);
  }
  return text;
}

// As the dialog's look for older files compares them.
void DescribeReplaced(const char* path, const FileRecord& packaged, PlannedPlace* place) {
  place->replaces = "nothing";
  if (FileExists(path) != 1) return;
  FileRecord installed = {};
  const bool hasVersion = ReadFileRecordFromDisk(path, &installed) == 1;
  place->replacedSize = installed.fileSize;
  place->replacedVersion = VersionText(installed);
  memcpy(installed.fileName, packaged.fileName, sizeof(installed.fileName));
  switch (CompareFileRecords(&packaged, &installed)) {
    case ComparisonFirstGreater:
    case ComparisonSecondGreater:
    case ComparisonThirdGreater:
      place->replaces = hasVersion ? "older" : "without version";
      break;
    case ComparisonFirstSmaller:
    case ComparisonSecondSmaller:
    case ComparisonThirdSmaller:
      place->replaces = "newer";
      break;
    default:
      place->replaces = place->replacedVersion.empty() ? "without version" : "equal";
  }
}

// A walk over the package that notes each place.
class SurveyPass {
 public:
  static constexpr bool kAddsEvents = false;
  static constexpr bool kTakesStreams = false;

  SurveyPass(RunPlan* plan, RunSurvey* survey) : plan_(plan), survey_(survey) {}

  StatusCode Begin() { return StatusOk; }

  FileRecord* RecordAt(int index) {
    record_ = {};
    number_ = index + 1;
    return &record_;
  }

  StatusCode Work(const FileRecord& record, const TargetList& targets) {
    for (int32_t i = 0; i < targets.count; ++i) {
      const TargetEntry& target = targets.entries[i];
      PlannedPlace place = {
          .record = number_, .path = machine::ToUtf8(target.path), .size = record.fileSize};
      DescribeReplaced(target.path, record, &place);
      plan_->places.push_back(place);
      survey_->placePaths.emplace_back(target.path);
      if (target.directory[0] != '\0') survey_->directories.insert(target.directory);
    }
    return StatusOk;
  }

 private:
  RunPlan* plan_;
  RunSurvey* survey_;
  FileRecord record_ = {};
  int number_ = 0;
};

class Surveyor {
 public:
  explicit Surveyor(RunPlan* plan) : plan_(plan) {
    context_.language = kLanguageNone;
    (void)ParseCommandLine(SkipProgramName(GetCommandLineA()), &context_);
    (void)ValidateLanguage(&context_.language);
  }
  ~Surveyor() { (void)CloseSetup(&context_); }
  Surveyor(const Surveyor&) = delete;
  Surveyor& operator=(const Surveyor&) = delete;

  RunSurvey Survey() {
    FindOwnFiles();
    FindFreeBytes();
    if ((context_.options & OptionHelp) != 0 || OpenPackage(&context_) != StatusOk) return survey_;
    (void)ApplyImageKind(&context_);
    plan_->isRemoval = (context_.options & OptionRemove) != 0;
    plan_->spaceNeeded = context_.header.spaceNeeded;
    SettleLanguage();
    if (!SettleDirectory()) return survey_;
    survey_.directories.insert(context_.installDir);
    SurveyPass pass(plan_, &survey_);
    (void)WalkPackage(&context_, pass);  // where it ends, so does the run, and says why
    FindLongestPath();
    return survey_;
  }

 private:
  void FindOwnFiles() {
    char program[kRemovalProgramPathSize] = {};
    if (FindRemovalProgramPath(program)) survey_.removalProgram = program;
    char log[kLogPathSize] = {};
    if (FindLogPath(log)) survey_.log = log;
  }

  void FindFreeBytes() {
    for (char letter = 'A'; letter <= 'Z'; ++letter) {
      const char root[] = {letter, ':', '\\', '\0'};
      uint64_t bytes = 0;
      if (GetFreeDiskSpace(root, &bytes)) survey_.freeBytes[letter] = bytes;
    }
  }

  void SettleLanguage() {
    SetupRequest registered = {};
    if (context_.language != kLanguageNone)
      plan_->languageReason = "given";
    else if (ReadRegisteredProduct(&registered) == 1 && registered.language != kLanguageNone)
      plan_->languageReason = "the registered product's";
    else
      plan_->languageReason =
          context_.header.defaultLanguage != kLanguageNone ? "the package's" : "the system's";
    (void)ChooseLanguage(&context_);
    plan_->language = context_.language;
  }

  // False when no file is touched: for want of a directory, or of a product to remove.
  bool SettleDirectory() {
    const std::string given = context_.installDir;
    const TextField packageDirectory(context_.header.defaultDirectory);
    (void)FindInstalledProduct(&context_);
    if (context_.productFound == 1) {
      SetupRequest registered = {};
      plan_->directoryReason = ReadRegisteredProduct(&registered) == 1 ? "registered"
                               : given == context_.installDir          ? "given, and there"
                                                                       : "found there";
    }
    if (plan_->isRemoval && context_.productFound != 1) return false;
    if (!plan_->isRemoval && !ChooseDirectory(packageDirectory.text)) return false;
    plan_->directory = machine::ToUtf8(context_.installDir);
    return true;
  }

  bool ChooseDirectory(const char* packageDirectory) {
    char given[kPathSize] = {};
    (void)CopyText(given, context_.installDir);
    if (plan_->directoryReason.empty()) {
      plan_->directoryReason = IsValidPath(given) == 1     ? "given"
                               : *packageDirectory != '\0' ? "the package's default"
                                                           : "the program's own";
    }
    return ChooseInstallDir(&context_, context_.installDir, sizeof(context_.installDir),
                            packageDirectory) == StatusOk;
  }

  void FindLongestPath() {
    std::vector<std::string> paths = survey_.placePaths;
    if (!plan_->isRemoval) paths.push_back(survey_.removalProgram);
    for (const std::string& path : paths) {
      if (path.size() <= plan_->longestLength) continue;
      plan_->longestLength = path.size();
      plan_->longestPath = machine::ToUtf8(path);
    }
  }

  RunPlan* plan_;
  RunSurvey survey_;
  SetupContext context_ = {};
};

}  // namespace

RunSurvey SurveyRun(RunPlan* plan) {
  return Surveyor(plan).Survey();
}

}  // namespace image
