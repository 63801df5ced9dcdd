// Every file is expanded under a temporary name first. Only when all of them are good do they take
// their names.

#include "tools/image/image_extractor.h"

#include <algorithm>
#include <map>
#include <memory>
#include <optional>

#include "machine/code_page.h"
#include "tools/image/bad_input.h"
#include "tools/image/host_text.h"
#include "tools/image/image_contents.h"
#include "tools/image/output_file.h"
#include "tools/image/progress_bar.h"
#include "tools/image/record_text.h"
#include "tools/image/target_rules.h"

namespace image {
namespace {

namespace fs = std::filesystem;

// A folder that goes again, unless it is kept, when it was not there before.
class OutputFolder {
 public:
  explicit OutputFolder(const fs::path& folder) : folder_(folder) {
    std::error_code error;
    isNew_ = fs::create_directory(folder, error);
    if (error || !fs::is_directory(folder)) {
      throw BadInput(folder, "is no folder and can't be made one; name another");
    }
  }
  ~OutputFolder() {
    std::error_code ignored;  // it can only stay behind, empty
    if (isNew_) fs::remove(folder_, ignored);
  }
  OutputFolder(const OutputFolder&) = delete;
  OutputFolder& operator=(const OutputFolder&) = delete;
  void Keep() { isNew_ = false; }

 private:
  fs::path folder_;
  bool isNew_ = false;
};

bool HaveEqualBytes(const fs::path& a, const fs::path& b) {
  const InputFile first(a);
  const InputFile second(b);
  if (first.Size() != second.Size()) return false;
  std::vector<uint8_t> firstBlock(65536);
  std::vector<uint8_t> secondBlock(65536);
  for (uint64_t offset = 0; offset < first.Size();) {
    const auto count =
        static_cast<size_t>(std::min<uint64_t>(firstBlock.size(), first.Size() - offset));
    first.Read(offset, std::span(firstBlock).first(count));
    second.Read(offset, std::span(secondBlock).first(count));
    if (!std::equal(firstBlock.begin(), firstBlock.begin() + static_cast<ptrdiff_t>(count),
                    secondBlock.begin())) {
      return false;
    }
    offset += count;
  }
  return true;
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
    for (const PackagedFile* packaged : chosen) CheckName(packaged->record);

    folder_.emplace(order_.folder);
    ExpandAll(chosen);
    std::vector<fs::path> written = CommitAll();
    folder_->Keep();
    return written;
  }

 private:
  std::vector<const PackagedFile*> ChooseFiles() const {
    std::vector<const PackagedFile*> chosen;
    std::vector<bool> isUsed(order_.names.size());
    for (const PackagedFile& packaged : contents_.files) {
      const std::string name = FieldText(packaged.record.fileName);
      bool isChosen = order_.names.empty();
      for (size_t i = 0; i < order_.names.size(); ++i) {
        if (!machine::EqualNoCase(machine::FromUtf8(order_.names[i]), name)) continue;
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

  void CheckName(const FileRecord& record) const {
    const std::string name = FieldText(record.fileName);
    if (const auto fault = FindNameFault(name)) {
      throw BadInput(order_.image,
                     "file name " + Shown(name) + " " + *fault + "; it is not extracted");
    }
    std::error_code error;
    const fs::path target = TargetOf(name);
    if (!order_.replaceExisting && fs::exists(fs::symlink_status(target, error))) {
      throw BadInput(target, "exists; give --force to replace it");
    }
  }

  fs::path TargetOf(const std::string& name) const {
    return order_.folder / PathOf(machine::ToUtf8(name));
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

  std::unique_ptr<OutputFile> Expand(const PackagedFile& packaged, ProgressBar* progress) const {
    const FileRecord& record = packaged.record;
    const std::string name = FieldText(record.fileName);
    auto output = std::make_unique<OutputFile>(TargetOf(name), FileKind::kData);
    const std::string fault = ExpandFile(file_, packaged, [&](std::span<const uint8_t> piece) {
      output->Write(piece);
      progress->Advance(piece.size());
    });
    if (!fault.empty()) {
      throw BadInput(order_.image,
                     "file " + Shown(name) + ": " + fault + "; the image is damaged, make it anew");
    }
    output->Close();
    return output;
  }

  // A package can hold one file several times, for several places.
  bool IsRepetition(const FileRecord& record, const OutputFile& output) {
    const std::string name = FieldText(record.fileName);
    const auto [earlier, isFirst] = byName_.emplace(ToUpper(name), &output);
    if (isFirst) return false;
    if (HaveEqualBytes(earlier->second->Temporary(), output.Temporary())) return true;
    throw BadInput(order_.image, "has two different files of the name " + Shown(name) +
                                     "; they can't stand in one folder");
  }

  std::vector<fs::path> CommitAll() {
    std::vector<fs::path> written;
    try {
      for (const auto& output : outputs_) {
        output->Commit();
        written.push_back(output->Target());
      }
    } catch (const BadInput&) {
      std::error_code ignored;  // the first failure is the one to tell
      for (const fs::path& path : written) fs::remove(path, ignored);
      throw;
    }
    return written;
  }

  const ExtractOrder& order_;
  InputFile file_;
  ImageContents contents_;
  std::optional<OutputFolder> folder_;
  std::vector<std::unique_ptr<OutputFile>> outputs_;  // gone before the folder can go
  std::map<std::string, const OutputFile*> byName_;   // in upper case
};

}  // namespace

std::vector<fs::path> ExtractImage(const ExtractOrder& order) {
  return Extractor(order).Extract();
}

}  // namespace image
