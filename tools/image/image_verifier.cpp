#include "tools/image/image_verifier.h"

#include <algorithm>
#include <set>
#include <span>

#include "tools/image/image_contents.h"
#include "tools/image/language_names.h"
#include "tools/image/progress_bar.h"
#include "tools/image/record_text.h"
#include "tools/image/stream_format.h"
#include "tools/image/target_rules.h"
#include "tools/image/version_data.h"

namespace image {
namespace {

std::string Number(uint64_t value) {
  return std::to_string(value);
}

bool IsZero(std::span<const uint8_t> bytes) {
  return std::all_of(bytes.begin(), bytes.end(), [](uint8_t byte) { return byte == 0; });
}

class Verifier {
 public:
  explicit Verifier(const std::filesystem::path& image) : file_(image) {}

  std::vector<Finding> Verify() {
    if (!FindHeader(file_)) {
      Wrong("no package header in the last 568 bytes");
      return std::move(findings_);
    }
    contents_ = ReadContents(file_);
    isRemoval_ = contents_.header.removalImageFlag == 1;
    CheckPart("header", [this] { CheckHeader(); });
    CheckPart("executable", [this] { CheckExecutable(); });
    CheckPart("regions", [this] { CheckRegions(); });
    ProgressBar progress("verifying", contents_.headerOffset - Position(0));
    for (size_t i = 0; i < contents_.files.size(); ++i) {
      const FileRecord& record = contents_.files[i].record;
      subject_ = "record " + Number(i + 1) + " " + Shown(FieldText(record.fileName)) + ": ";
      CheckPart(Number(record.storedSize) + " bytes for " + Number(record.fileSize),
                [&] { CheckRecord(contents_.files[i]); });
      progress.Advance(sizeof record + record.storedSize);
    }
    return std::move(findings_);
  }

 private:
  void Wrong(const std::string& text) { findings_.push_back({false, subject_ + text}); }

  // Runs a check; one that finds nothing wrong gives a good finding.
  template <class Check>
  void CheckPart(const std::string& name, const Check& check) {
    const size_t before = findings_.size();
    check();
    if (findings_.size() == before) findings_.push_back({true, subject_ + name});
  }

  void CheckField(std::span<const char> field, const std::string& name) {
    if (!IsFieldFilled(field)) Wrong(name + " does not end with a NUL and zeros behind it");
  }

  uint64_t Position(size_t index) const {
    if (index < contents_.files.size()) return contents_.files[index].offset;
    if (!contents_.files.empty()) return contents_.files.back().End();
    return std::min<uint64_t>(contents_.header.dataOffset, contents_.headerOffset);
  }

  void CheckHeader() {
    const PackageHeader& header = contents_.header;
    if (header.removalImageFlag > 1) {
      Wrong("removalImageFlag is " + Number(header.removalImageFlag) + ", neither 0 nor 1");
    }
    CheckField(header.defaultDirectory, "defaultDirectory");
    const std::string directory = FieldText(header.defaultDirectory);
    if (const auto fault = FindDirectoryFault(directory)) {
      Wrong("defaultDirectory " + Shown(directory) + " " + *fault);
    }
    if (!IsLanguage(header.defaultLanguage)) {
      Wrong("defaultLanguage " + std::to_string(header.defaultLanguage) + " is none of " +
            kLanguageNames);
    }
    if (!IsZero(header.reserved)) Wrong("the header's reserved bytes are not zero");
  }

  void CheckExecutable() {
    if (contents_.header.dataOffset == 0) {
      Wrong("no executable in front of the package");
    } else if (!ReadVersionData(file_.Path()).IsComplete()) {
      Wrong("the executable has no version resource with a translation and a file version");
    }
  }

  void CheckRegions() {
    const PackageHeader& header = contents_.header;
    if (file_.Size() > kLargestSize) Wrong("the image has 2 GiB or more");
    if (!contents_.damage.empty()) {
      Wrong(contents_.damage);
      return;
    }
    const uint64_t end = Position(contents_.files.size());
    if (end != contents_.headerOffset) {
      Wrong(Number(contents_.headerOffset - end) +
            " bytes stand between the last record's end at " + Number(end) + " and the header");
    }
    const uint64_t length = isRemoval_ ? uint64_t{header.recordCount} * sizeof(FileRecord)
                                       : file_.Size() - header.dataOffset;
    if (header.packageLength != length) {
      Wrong("packageLength is " + Number(header.packageLength) + " instead of " + Number(length));
    }
    uint64_t sizes = 0;
    for (const PackagedFile& packaged : contents_.files) sizes += packaged.record.fileSize;
    if (header.spaceNeeded < sizes) {
      Wrong("spaceNeeded is " + Number(header.spaceNeeded) + ", the files' sizes make " +
            Number(sizes));
    }
  }

  void CheckRecord(const PackagedFile& packaged) {
    const FileRecord& record = packaged.record;
    CheckField(record.fileName, "fileName");
    CheckField(record.destination, "destination");
    CheckField(record.versionLanguage, "versionLanguage");
    if (!IsZero(record.reserved)) Wrong("the reserved bytes are not zero");
    CheckTargets(FieldText(record.fileName), FieldText(record.destination));
    CheckVersion(record);
    if (record.fileSize > kLargestSize) {
      Wrong("fileSize " + Number(record.fileSize) + " is 2 GiB or more");
    } else {
      CheckStream(packaged);
    }
  }

  void CheckTargets(const std::string& name, const std::string& destination) {
    if (const auto fault = FindNameFault(name)) Wrong("fileName " + Shown(name) + " " + *fault);
    // Words that are no macro are legal names; who packs is asked about them.
    if (const auto fault = FindDestinationFault(
            destination, name, FieldText(contents_.header.defaultDirectory), true)) {
      Wrong("destination " + Shown(destination) + " " + *fault);
    }
    for (const std::string& key : TargetKeys(destination, name)) {
      if (targets_.insert(key).second) continue;
      Wrong("goes to a place that is filled already");
    }
  }

  void CheckVersion(const FileRecord& record) {
    const std::string language = FieldText(record.versionLanguage);
    const bool isHexadecimal = language.find_first_not_of("0123456789abcdef") == std::string::npos;
    if (!language.empty() && (language.size() != 8 || !isHexadecimal)) {
      Wrong("versionLanguage " + Shown(language) + " is not 8 lower-case hexadecimal digits");
    }
  }

  void CheckStream(const PackagedFile& packaged) {
    const FileRecord& record = packaged.record;
    if (isRemoval_) {
      if (record.storedSize != 0) {
        Wrong("storedSize is " + Number(record.storedSize) + ", a removal program has no streams");
      }
      return;
    }
    const std::string fault = ExpandFile(file_, packaged, [](std::span<const uint8_t>) {});
    if (!fault.empty()) Wrong(fault);
  }

  InputFile file_;
  ImageContents contents_;
  bool isRemoval_ = false;
  std::string subject_;            // in front of each finding's text
  std::set<std::string> targets_;  // keys of the places that are filled
  std::vector<Finding> findings_;
};

}  // namespace

std::vector<Finding> VerifyImage(const std::filesystem::path& image) {
  return Verifier(image).Verify();
}

}  // namespace image
