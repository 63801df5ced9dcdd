#include "tools/image/image_verifier.h"

#include <algorithm>
#include <optional>
#include <span>
#include <unordered_map>

#include "tools/image/image_contents.h"
#include "tools/image/language_names.h"
#include "tools/image/progress_bar.h"
#include "tools/image/record_text.h"
#include "tools/image/source_comparison.h"
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
  Verifier(const VerifyOrder& order, const std::function<void(const Finding&)>& tell)
      : file_(order.image), tell_(tell) {
    if (!order.description.empty()) sources_.emplace(order.description, order.sourceFolder);
  }

  PartCount Verify() {
    if (!FindHeader(file_)) {
      CheckPart("header", "", [this] { Wrong("no package header in the last 568 bytes"); });
      return count_;
    }
    contents_ = ReadContents(file_);
    isRemoval_ = contents_.header.removalImageFlag == 1;
    CheckPart("header", "", [this] { CheckHeader(); });
    CheckPart("executable", "", [this] { CheckExecutable(); });
    CheckPart("regions", "", [this] { CheckRegions(); });
    ProgressBar progress("verifying", contents_.headerOffset - Position(0));
    for (size_t i = 0; i < contents_.files.size(); ++i) {
      const FileRecord& record = contents_.files[i].record;
      CheckPart("record " + Number(i + 1) + " " + Shown(FieldText(record.fileName)),
                Number(record.storedSize) + " bytes for " + Number(record.fileSize),
                [this, i] { CheckRecord(i); });
      progress.Advance(sizeof record + record.storedSize);
    }
    return count_;
  }

 private:
  void Wrong(const std::string& text) {
    isGood_ = false;
    tell_({Finding::Kind::kWrong, part_, text});
  }
  void Note(const std::string& text) { tell_({Finding::Kind::kNote, part_, text}); }

  // Runs a check; one that finds nothing wrong gives a good finding.
  template <class Check>
  void CheckPart(const std::string& part, const std::string& goodText, const Check& check) {
    part_ = part;
    isGood_ = true;
    check();
    ++count_.parts;
    if (isGood_) {
      tell_({Finding::Kind::kGood, part_, goodText});
    } else {
      ++count_.wrong;
    }
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
    if (!IsZero(header.reserved)) Wrong("the reserved bytes are not zero");
    if (sources_) sources_->CompareHeader(header, [this](const std::string& text) { Wrong(text); });
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
    CheckSpace();
  }

  // An author may ask for more than the files need, not for less.
  void CheckSpace() {
    uint64_t sizes = 0;
    uint64_t certain = 0;
    for (const PackagedFile& packaged : contents_.files) {
      sizes += packaged.record.fileSize;
      certain += packaged.record.fileSize *
                 uint64_t{CountCertainPlaces(FieldText(packaged.record.destination))};
    }
    const uint64_t space = contents_.header.spaceNeeded;
    if (space < sizes) {
      Wrong("spaceNeeded is " + Number(space) + ", the files' sizes make " + Number(sizes));
    } else if (space < certain && !isRemoval_) {
      Note("spaceNeeded is " + Number(space) + ", the files in all their certain places need " +
           Number(certain));
    }
  }

  void CheckRecord(size_t index) {
    const PackagedFile& packaged = contents_.files[index];
    const FileRecord& record = packaged.record;
    CheckField(record.fileName, "fileName");
    CheckField(record.destination, "destination");
    CheckField(record.versionLanguage, "versionLanguage");
    if (!IsZero(record.reserved)) Wrong("the reserved bytes are not zero");
    CheckTargets(index + 1, FieldText(record.fileName), FieldText(record.destination));
    CheckVersion(record);
    const bool hasSource =
        sources_ &&
        sources_->CompareRecord(index, record, [this](const std::string& text) { Wrong(text); });
    if (record.fileSize > kLargestSize) {
      Wrong("fileSize " + Number(record.fileSize) + " is 2 GiB or more");
    } else {
      CheckStream(packaged, hasSource ? sources_->OpenSource(index) : nullptr);
    }
  }

  void CheckTargets(size_t number, const std::string& name, const std::string& destination) {
    if (const auto fault = FindNameFault(name)) Wrong("fileName " + Shown(name) + " " + *fault);
    // Words that are no macro are legal names; who packs is asked about them.
    if (const auto fault = FindDestinationFault(
            destination, name, FieldText(contents_.header.defaultDirectory), true)) {
      Wrong("destination " + Shown(destination) + " " + *fault);
    }
    std::optional<size_t> filler;
    for (const std::string& key : TargetKeys(destination, name)) {
      const auto [place, isNew] = fillers_.emplace(std::hash<std::string>()(key), number);
      if (!isNew && !filler) filler = place->second;
    }
    if (!filler) return;
    Wrong(*filler == number ? "goes to one place twice"
                            : "goes to a place that record " + Number(*filler) + " fills already");
  }

  void CheckVersion(const FileRecord& record) {
    const std::string language = FieldText(record.versionLanguage);
    const bool isHexadecimal = language.find_first_not_of("0123456789abcdef") == std::string::npos;
    if (!language.empty() && (language.size() != 8 || !isHexadecimal)) {
      Wrong("versionLanguage " + Shown(language) + " is not 8 lower-case hexadecimal digits");
    }
  }

  void CheckStream(const PackagedFile& packaged, const std::unique_ptr<SourceBytes>& source) {
    const FileRecord& record = packaged.record;
    if (isRemoval_) {
      if (record.storedSize != 0) {
        Wrong("storedSize is " + Number(record.storedSize) + ", a removal program has no streams");
      }
      return;
    }
    const std::string fault =
        ExpandFile(file_, packaged, [&source](std::span<const uint8_t> piece) {
          if (source) source->Take(piece);
        });
    if (!fault.empty()) {
      Wrong(fault);
    } else if (source && !source->Fault().empty()) {
      Wrong(source->Fault());
    }
  }

  InputFile file_;
  ImageContents contents_;
  bool isRemoval_ = false;
  std::string part_;
  bool isGood_ = true;  // the part, as far as it has been looked at
  PartCount count_;
  // Digest of a place's key to the number of the record that fills it: a package of some megabytes
  // can name millions of places.
  std::unordered_map<size_t, size_t> fillers_;
  std::optional<SourceComparison> sources_;
  const std::function<void(const Finding&)>& tell_;
};

}  // namespace

PartCount VerifyImage(const VerifyOrder& order, const std::function<void(const Finding&)>& tell) {
  return Verifier(order, tell).Verify();
}

}  // namespace image
