#include "tools/image/record_maker.h"

#include <map>

#include "tools/image/input_file.h"
#include "tools/image/place_warnings.h"
#include "tools/image/record_text.h"
#include "tools/image/stream_format.h"
#include "tools/image/target_rules.h"
#include "tools/image/version_data.h"

namespace image {
namespace {

class RecordMaker {
 public:
  RecordMaker(const PackageDescription& description, bool allowUnknownMacros, FaultList* faults)
      : description_(description), allowUnknownMacros_(allowUnknownMacros), faults_(*faults) {}

  PackageRecords Make() {
    const DescribedText& directory = description_.defaultDirectory;
    if (const auto fault = FindDirectoryFault(directory.text)) {
      faults_.Add(directory.line, "\"default_directory\" " + Shown(directory.text) + " " + *fault);
    }
    for (const FileDescription& file : description_.files) AddRecord(file);
    CheckSums();
    if (faults_.IsEmpty()) WarnOfPlaces();
    return std::move(made_);
  }

 private:
  void AddRecord(const FileDescription& file) {
    FileRecord record = {};
    record.recordSize = sizeof record;
    CheckTexts(file);
    (void)SetFieldText(record.fileName, file.name.text);  // what doesn't fit is a fault
    (void)SetFieldText(record.destination, file.destination.text);
    VersionData version;
    try {
      record.fileSize = static_cast<uint32_t>(SizeOfSource(file));
      version = ReadVersion(file);
    } catch (const BadInput& fault) {
      faults_.Add(file.sourceLine, std::string("\"source\": ") + fault.what());
    }
    TakeToldVersion(file, &version);
    record.versionFirst = version.fields[0];
    record.versionSecond = version.fields[1];
    record.versionThird = version.fields[2];
    (void)SetFieldText(record.versionLanguage, version.language);
    made_.sizes += record.fileSize;
    made_.spaceNeeded += record.fileSize * CountCertainPlaces(file.destination.text);
    made_.records.push_back(record);
  }

  void CheckTexts(const FileDescription& file) {
    const DescribedText& name = file.name;
    const DescribedText& destination = file.destination;
    if (const auto fault = FindNameFault(name.text)) {
      faults_.Add(name.line, "\"name\" " + Shown(name.text) + " " + *fault);
    }
    if (const auto fault = FindDestinationFault(
            destination.text, name.text, description_.defaultDirectory.text, allowUnknownMacros_)) {
      faults_.Add(destination.line, "\"destination\" " + Shown(destination.text) + " " + *fault);
      return;
    }
    for (const std::string& key : TargetKeys(destination.text, name.text)) {
      const auto [other, isNew] = targets_.emplace(key, destination.line);
      if (isNew) continue;
      faults_.Add(destination.line, "\"destination\" sends " + Shown(name.text) +
                                        " to a place that line " + std::to_string(other->second) +
                                        " fills; leave one out");
      return;
    }
  }

  uint64_t SizeOfSource(const FileDescription& file) const {
    const InputFile source(description_.SourceOf(file));
    if (source.Size() > kLargestSize)
      throw BadInput(source.Path(), "has 2 GiB or more; use a smaller file");
    return source.Size();
  }

  VersionData ReadVersion(const FileDescription& file) {
    VersionData version = ReadVersionData(description_.SourceOf(file));
    if (const auto told = FindMisreadVersion(version)) {
      faults_.Warn(file.sourceLine,
                   "\"source\" " + Shown(file.name.text) + " has the version " +
                       Shown(version.text) + ", which the setup program reads as " +
                       DescribeVersion(version.fields) +
                       ", of the installed file too; write it into the file as " + *told);
    }
    return version;
  }

  void TakeToldVersion(const FileDescription& file, VersionData* version) {
    if (file.version && !ParseVersion(file.version->text, version->fields)) {
      faults_.Add(file.version->line, "\"version\" " + Shown(file.version->text) +
                                          " is to be three numbers of 0 to 32767, as 4.1.7");
    }
    if (!file.language) return;
    version->language = file.language->text;
    if (!IsTranslation(version->language)) {
      faults_.Add(file.language->line,
                  "\"language\" " + Shown(version->language) +
                      " is to be 8 lower-case hexadecimal digits, as 040c04b0");
    }
  }

  static bool IsTranslation(const std::string& text) {
    return text.size() == 8 && text.find_first_not_of("0123456789abcdef") == std::string::npos;
  }

  void CheckSums() {
    if (made_.sizes > kLargestSize) {
      faults_.Add(
          BadInput(description_.file, "the files have 2 GiB or more together; leave some out"));
    } else if (made_.spaceNeeded > UINT32_MAX && !description_.spaceNeeded) {
      faults_.Add(BadInput(description_.file, "the files need " +
                                                  std::to_string(made_.spaceNeeded) +
                                                  " bytes at their places, more than can be asked "
                                                  "for; give a \"space_needed\""));
    }
  }

  void WarnOfPlaces() {
    std::vector<std::string> destinations;
    for (const FileDescription& file : description_.files)
      destinations.push_back(file.destination.text);
    for (const PlaceWarning& warning :
         FindPlaceWarnings(destinations, description_.defaultDirectory.text)) {
      const DescribedText& destination = description_.files[warning.file].destination;
      faults_.Warn(destination.line,
                   "\"destination\" " + Shown(destination.text) + " " + warning.text);
    }
  }

  const PackageDescription& description_;
  const bool allowUnknownMacros_;
  FaultList& faults_;
  PackageRecords made_;
  std::map<std::string, int> targets_;  // key of a place to the line that fills it
};

}  // namespace

PackageRecords MakeRecords(const PackageDescription& description, bool allowUnknownMacros,
                           FaultList* faults) {
  return RecordMaker(description, allowUnknownMacros, faults).Make();
}

}  // namespace image
