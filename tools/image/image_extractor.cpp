// Every file is expanded under a temporary name first. Only when all of them are good do they take
// their names.

#include "tools/image/image_extractor.h"

#include <algorithm>
#include <map>
#include <memory>

#include "machine/code_page.h"
#include "tools/image/bad_input.h"
#include "tools/image/byte_comparison.h"
#include "tools/image/file_places.h"
#include "tools/image/file_replacement.h"
#include "tools/image/host_text.h"
#include "tools/image/image_contents.h"
#include "tools/image/output_file.h"
#include "tools/image/progress_bar.h"
#include "tools/image/record_text.h"
#include "tools/image/target_rules.h"

namespace image {
namespace {

namespace fs = std::filesystem;

// The folders of the output. Those that were not there before go again, unless they are kept.
class OutputFolders {
 public:
  OutputFolders() = default;
  ~OutputFolders() {
    std::error_code ignored;  // it can only stay behind, empty
    for (auto folder = made_.rbegin(); folder != made_.rend(); ++folder) {
      fs::remove(*folder, ignored);
    }
  }
  OutputFolders(const OutputFolders&) = delete;
  OutputFolders& operator=(const OutputFolders&) = delete;

  void Make(const fs::path& folder) {
    std::error_code error;
    if (fs::create_directory(folder, error)) made_.push_back(folder);
    if (error || !fs::is_directory(folder)) {
      throw BadInput(folder, "is no folder and can't be made one; name another");
    }
  }

  // The folders on the way from `top`, which is there, to `place`. None of them may be a link,
  // which would lead out of it.
  void MakeBetween(const fs::path& top, const fs::path& place) {
    fs::path folder = top;
    for (const fs::path& name : place.parent_path()) {
      folder /= name;
      if (fs::is_symlink(fs::symlink_status(folder))) {
        throw BadInput(folder, "is a link, which leads elsewhere; name another folder");
      }
      Make(folder);
    }
  }

  void Keep() { made_.clear(); }

 private:
  std::vector<fs::path> made_;
};

bool AreEqual(const fs::path& a, const fs::path& b) {
  const InputFile first(a);
  const InputFile second(b);
  return first.Size() == second.Size() && HaveEqualBytes(first, second, first.Size());
}

class Extractor {
 public:
  explicit Extractor(const ExtractOrder& order)
      : order_(order), file_(order.image), contents_(ReadWholeContents(file_)) {}

  std::vector<fs::path> Extract() {
    if (contents_.header.removalImageFlag == 1) {
      throw BadInput(order_.image,
                     "is a removal program, which holds no files; name a setup image");
    }
    const std::vector<const PackagedFile*> chosen = ChooseFiles();
    for (const PackagedFile* packaged : chosen) CheckRecord(packaged->record);

    folders_.Make(order_.folder);
    CheckSpace(chosen);
    ExpandAll(chosen);
    CommitTogether(outputs_);
    folders_.Keep();
    std::vector<fs::path> written;
    for (const auto& output : outputs_) written.push_back(output->Target());
    return written;
  }

 private:
  // Whether the user's word means this record; `number` counts from 1.
  static bool IsMeant(const std::string& word, size_t number, const FileRecord& record) {
    if (!word.starts_with('#')) {
      return machine::EqualNoCase(machine::FromUtf8(word), FieldText(record.fileName));
    }
    return word.substr(1) == std::to_string(number);
  }

  std::vector<const PackagedFile*> ChooseFiles() const {
    std::vector<const PackagedFile*> chosen;
    std::vector<bool> isUsed(order_.names.size());
    for (size_t number = 1; number <= contents_.files.size(); ++number) {
      const PackagedFile& packaged = contents_.files[number - 1];
      bool isChosen = order_.names.empty();
      for (size_t i = 0; i < order_.names.size(); ++i) {
        if (!IsMeant(order_.names[i], number, packaged.record)) continue;
        isUsed[i] = isChosen = true;
      }
      if (isChosen) chosen.push_back(&packaged);
    }
    const auto unused = std::find(isUsed.begin(), isUsed.end(), false);
    if (unused != isUsed.end()) {
      throw BadInput(order_.image, "has no file \"" +
                                       order_.names[static_cast<size_t>(unused - isUsed.begin())] +
                                       "\"; the list command tells what it has");
    }
    return chosen;
  }

  void CheckRecord(const FileRecord& record) const {
    const std::string name = FieldText(record.fileName);
    if (const auto fault = FindNameFault(name)) {
      throw BadInput(order_.image,
                     "file name " + Shown(name) + " " + *fault + "; it is not extracted");
    }
    if (order_.isTree) {
      const std::string destination = FieldText(record.destination);
      if (const auto fault = FindDestinationFault(destination, name, "", true)) {
        throw BadInput(order_.image, "destination " + Shown(destination) + " " + *fault +
                                         "; it is not extracted");
      }
    }
    CheckTarget(TargetOf(record));
  }

  void CheckTarget(const fs::path& target) const {
    std::error_code error;
    const fs::file_status status = fs::symlink_status(target, error);
    if (!fs::exists(status)) return;
    if (!order_.replaceExisting) {
      throw BadInput(target, "exists; give --force to replace it");
    }
    if (!fs::is_regular_file(status) && !fs::is_symlink(status)) {
      throw BadInput(target, "is not a plain file; it is not replaced");
    }
  }

  fs::path TargetOf(const FileRecord& record) const {
    return order_.folder / (order_.isTree ? TreePlace(record) : FlatPlace(record));
  }

  // All files stand in full beside those that they replace.
  void CheckSpace(const std::vector<const PackagedFile*>& chosen) const {
    uint64_t needed = 0;
    for (const PackagedFile* packaged : chosen) needed += packaged->record.fileSize;
    std::error_code error;
    const fs::space_info space = fs::space(order_.folder, error);
    if (error || needed <= space.available) return;
    throw BadInput(order_.folder, "has " + std::to_string(space.available) +
                                      " bytes free, the files need " + std::to_string(needed));
  }

  void ExpandAll(const std::vector<const PackagedFile*>& chosen) {
    uint64_t total = 0;
    for (const PackagedFile* packaged : chosen) total += packaged->record.fileSize;
    ProgressBar progress("extracting", total);
    for (const PackagedFile* packaged : chosen) {
      auto output = Expand(*packaged, &progress);
      if (!IsRepetition(packaged->record, *output)) outputs_.push_back(std::move(output));
    }
  }

  std::unique_ptr<OutputFile> Expand(const PackagedFile& packaged, ProgressBar* progress) {
    const FileRecord& record = packaged.record;
    folders_.MakeBetween(order_.folder, order_.isTree ? TreePlace(record) : FlatPlace(record));
    auto output = std::make_unique<OutputFile>(TargetOf(record), FileKind::kData);
    const std::string fault = ExpandFile(file_, packaged, [&](std::span<const uint8_t> piece) {
      output->Write(piece);
      progress->Advance(piece.size());
    });
    if (!fault.empty()) {
      throw BadInput(order_.image, "file " + Shown(FieldText(record.fileName)) + ": " + fault +
                                       "; the image is damaged, make it anew");
    }
    output->Close();
    return output;
  }

  // A package can hold one file several times, for several places.
  bool IsRepetition(const FileRecord& record, const OutputFile& output) {
    const std::string place = ToUpper(machine::FromUtf8(TextOf(output.Target())));
    const auto [earlier, isFirst] = byPlace_.emplace(place, &output);
    if (isFirst) return false;
    if (AreEqual(earlier->second->Temporary(), output.Temporary())) return true;
    throw BadInput(order_.image,
                   "has two different files of the name " + Shown(FieldText(record.fileName)) +
                       "; they can't stand in one folder" + (order_.isTree ? "" : ": give --tree"));
  }

  const ExtractOrder& order_;
  InputFile file_;
  ImageContents contents_;
  OutputFolders folders_;
  std::vector<std::unique_ptr<OutputFile>> outputs_;  // gone before the folders can go
  std::map<std::string, const OutputFile*> byPlace_;  // in upper case
};

}  // namespace

std::vector<fs::path> ExtractImage(const ExtractOrder& order) {
  return Extractor(order).Extract();
}

}  // namespace image
