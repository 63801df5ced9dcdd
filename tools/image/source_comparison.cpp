#include "tools/image/source_comparison.h"

#include <algorithm>

#include "tools/image/host_text.h"
#include "tools/image/record_text.h"
#include "tools/image/record_version.h"

namespace image {
namespace {

std::string Differs(const std::string& what, const std::string& found, const std::string& wanted) {
  return what + " is " + found + ", the sources make it " + wanted;
}

}  // namespace

void SourceBytes::Take(std::span<const uint8_t> piece) {
  const uint64_t left = file_.Size() - std::min(taken_, file_.Size());
  const auto count = static_cast<size_t>(std::min<uint64_t>(piece.size(), left));
  if (!firstDifference_ && count > 0) {
    block_.resize(count);
    file_.Read(taken_, block_);
    const auto at = std::mismatch(block_.begin(), block_.end(), piece.begin()).first;
    if (at != block_.end()) {
      firstDifference_ = taken_ + static_cast<uint64_t>(at - block_.begin());
    }
  }
  taken_ += piece.size();
}

std::string SourceBytes::Fault() const {
  const std::string source = TextOf(file_.Path());
  if (firstDifference_) {
    return "differs from " + source + " at byte " + std::to_string(*firstDifference_);
  }
  if (taken_ == file_.Size()) return "";
  return "has " + std::to_string(taken_) + " bytes, " + source + " has " +
         std::to_string(file_.Size());
}

SourceComparison::SourceComparison(const std::filesystem::path& description,
                                   const std::filesystem::path& folder) {
  FaultList faults(description);
  description_ = ReadDescription(description, folder, &faults);
  made_ = MakeRecords(description_, true, &faults);
  faults.ThrowIfAny();
}

void SourceComparison::CompareHeader(const PackageHeader& header, const FaultTeller& tell) const {
  const size_t count = made_.records.size();
  if (header.recordCount != count) {
    tell(Differs("recordCount", std::to_string(header.recordCount), std::to_string(count)));
  }
  if ((header.removalImageFlag == 1) != description_.isRemoval) {
    tell(std::string("it is ") + (description_.isRemoval ? "no" : "a") + " removal program");
  }
  const std::string directory = FieldText(header.defaultDirectory);
  if (directory != description_.defaultDirectory.text) {
    tell(Differs("defaultDirectory", Shown(directory), Shown(description_.defaultDirectory.text)));
  }
  if (header.defaultLanguage != description_.defaultLanguage) {
    tell(Differs("defaultLanguage", DescribeLanguage(header.defaultLanguage),
                 DescribeLanguage(description_.defaultLanguage)));
  }
  const uint64_t space = description_.spaceNeeded.value_or(
      static_cast<uint32_t>(std::min<uint64_t>(made_.spaceNeeded, UINT32_MAX)));
  if (header.spaceNeeded != space) {
    tell(Differs("spaceNeeded", std::to_string(header.spaceNeeded), std::to_string(space)));
  }
}

bool SourceComparison::CompareRecord(size_t index, const FileRecord& record,
                                     const FaultTeller& tell) const {
  if (index >= made_.records.size()) {
    tell("the sources have no file of this number");
    return false;
  }
  const FileRecord& wanted = made_.records[index];
  const auto compare = [&tell](const std::string& what, const std::string& found,
                               const std::string& expected) {
    if (found != expected) tell(Differs(what, found, expected));
    return found == expected;
  };
  const auto compareField = [&compare](const std::string& what, std::span<const char> found,
                                       std::span<const char> expected) {
    return compare(what, Shown(FieldText(found)), Shown(FieldText(expected)));
  };
  if (!compareField("fileName", record.fileName, wanted.fileName)) return false;
  compareField("destination", record.destination, wanted.destination);
  compare("the version", DescribeVersion(record), DescribeVersion(wanted));
  compareField("versionLanguage", record.versionLanguage, wanted.versionLanguage);
  return !description_.isRemoval;
}

std::unique_ptr<SourceBytes> SourceComparison::OpenSource(size_t index) const {
  return std::make_unique<SourceBytes>(description_.SourceOf(description_.files[index]));
}

}  // namespace image
