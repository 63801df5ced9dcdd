#include "tools/image/image_builder.h"

#include <algorithm>
#include <cstring>
#include <map>

#include "tools/image/bad_input.h"
#include "tools/image/executable_part.h"
#include "tools/image/image_contents.h"
#include "tools/image/output_file.h"
#include "tools/image/package_description.h"
#include "tools/image/parallel_packer.h"
#include "tools/image/progress_bar.h"
#include "tools/image/record_text.h"
#include "tools/image/stream_format.h"
#include "tools/image/stream_packer.h"
#include "tools/image/target_rules.h"
#include "tools/image/version_data.h"

namespace image {
namespace {

constexpr size_t kMostRecords = 0xFFFF;

class ImageBuilder {
 public:
  explicit ImageBuilder(const PackOrder& order)
      : order_(order), description_(ReadDescription(order.description)) {}

  void Build() {
    CheckDirectory();
    for (const FileDescription& file : description_.files) AddRecord(file);
    FillHeader();

    const InputFile stub(order_.stub);
    CheckStub(stub);
    OutputFile output(order_.output, FileKind::kProgram);
    CopyExecutable(stub, stub.Size(), &output);
    position_ = stub.Size();
    WriteRecords(&output);
    header_.dataOffset = static_cast<uint32_t>(stub.Size());
    header_.packageLength =
        static_cast<uint32_t>(description_.isRemoval ? records_.size() * sizeof(FileRecord)
                                                     : position_ + sizeof header_ - stub.Size());
    Advance(sizeof header_);
    output.Write(BytesOf(header_));
    output.Commit();
  }

 private:
  [[noreturn]] void Fail(int line, const std::string& what) const {
    throw BadInput(description_.file, line, what);
  }

  void CheckStub(const InputFile& stub) const {
    RequireOtherFile(order_.stub, order_.output);
    if (FindHeader(stub)) {
      throw BadInput(order_.stub,
                     "has a package behind it already; use the setup program as it was built");
    }
    if (stub.Size() > kLargestSize)
      throw BadInput(order_.stub, "has 2 GiB or more; use a smaller file");
    RequireVersion(order_.stub);
  }

  void CheckDirectory() const {
    const DescribedText& directory = description_.defaultDirectory;
    if (const auto fault = FindDirectoryFault(directory.text)) {
      Fail(directory.line, "\"default_directory\" " + Shown(directory.text) + " " + *fault);
    }
  }

  std::filesystem::path SourceOf(const FileDescription& file) const {
    const std::filesystem::path folder =
        order_.sourceFolder.empty() ? order_.description.parent_path() : order_.sourceFolder;
    return folder / file.source;
  }

  void AddRecord(const FileDescription& file) {
    if (records_.size() == kMostRecords)
      Fail(file.sourceLine, "more than 65535 files; leave some out");
    CheckTexts(file);
    FileRecord record = {};
    record.recordSize = sizeof record;
    if (!SetFieldText(record.fileName, file.name.text) ||
        !SetFieldText(record.destination, file.destination.text)) {
      Fail(file.sourceLine, "a text does not fit its field");
    }
    SetVersion(file, &record);
    record.fileSize = static_cast<uint32_t>(SizeOfSource(file));
    sizes_ += record.fileSize;
    records_.push_back(record);
  }

  void CheckTexts(const FileDescription& file) {
    const DescribedText& name = file.name;
    const DescribedText& destination = file.destination;
    if (const auto fault = FindNameFault(name.text)) {
      Fail(name.line, "\"name\" " + Shown(name.text) + " " + *fault);
    }
    if (const auto fault =
            FindDestinationFault(destination.text, name.text, description_.defaultDirectory.text,
                                 order_.allowUnknownMacros)) {
      Fail(destination.line, "\"destination\" " + Shown(destination.text) + " " + *fault);
    }
    for (const std::string& key : TargetKeys(destination.text, name.text)) {
      const auto [other, isNew] = targets_.emplace(key, destination.line);
      if (isNew) continue;
      Fail(destination.line, "\"destination\" sends " + Shown(name.text) +
                                 " to a place that line " + std::to_string(other->second) +
                                 " fills; leave one out");
    }
  }

  uint64_t SizeOfSource(const FileDescription& file) const {
    const InputFile source(SourceOf(file));
    if (source.Size() > kLargestSize)
      throw BadInput(source.Path(), "has 2 GiB or more; use a smaller file");
    return source.Size();
  }

  void SetVersion(const FileDescription& file, FileRecord* record) const {
    VersionData version = ReadVersionData(SourceOf(file));
    if (file.version) {
      if (file.version->text.empty())
        Fail(file.version->line, "\"version\" is empty; leave it out");
      ParseVersion(file.version->text, version.fields);
    }
    if (file.language) version.language = ReadLanguage(*file.language);
    record->versionFirst = version.fields[0];
    record->versionSecond = version.fields[1];
    record->versionThird = version.fields[2];
    (void)SetFieldText(record->versionLanguage, version.language);  // 8 digits at most
  }

  std::string ReadLanguage(const DescribedText& language) const {
    const bool isHexadecimal =
        language.text.find_first_not_of("0123456789abcdef") == std::string::npos;
    if (language.text.size() != 8 || !isHexadecimal) {
      Fail(language.line, "\"language\" is to be 8 lower-case hexadecimal digits, as 040c04b0");
    }
    return language.text;
  }

  void FillHeader() {
    if (sizes_ > kLargestSize) {
      throw BadInput(description_.file, "the files have 2 GiB or more together; leave some out");
    }
    header_.headerSize = sizeof header_;
    std::memcpy(header_.magic, kPackageMagic, sizeof kPackageMagic);
    header_.recordCount = static_cast<uint16_t>(records_.size());
    header_.removalImageFlag = description_.isRemoval ? 1 : 0;
    header_.spaceNeeded = description_.spaceNeeded.value_or(static_cast<uint32_t>(sizes_));
    (void)SetFieldText(header_.defaultDirectory, description_.defaultDirectory.text);  // checked
    header_.defaultLanguage = description_.defaultLanguage;
  }

  void WriteRecords(OutputFile* output) {
    ProgressBar progress("packing", sizes_);
    ParallelPacker packer(description_.isRemoval ? 0 : records_.size(),
                          [&](size_t i) { return PackSource(i, &progress); });
    for (size_t i = 0; i < records_.size(); ++i) {
      FileRecord& record = records_[i];
      std::vector<uint8_t> stream;
      if (!description_.isRemoval) stream = packer.Take(i);
      Advance(sizeof record + stream.size());
      record.storedSize = static_cast<uint32_t>(stream.size());
      output->Write(BytesOf(record));
      output->Write(stream);
    }
  }

  // Called from several threads at a time, when the records are complete but for their storedSize.
  std::vector<uint8_t> PackSource(size_t i, ProgressBar* progress) const {
    const std::filesystem::path source = SourceOf(description_.files[i]);
    const std::vector<uint8_t> bytes = ReadWholeFile(source, kLargestSize);
    if (bytes.size() != records_[i].fileSize)
      throw BadInput(source, "changed meanwhile; try again");
    return PackStream(bytes, order_.best ? kPackBest : kPackFast,
                      [progress](size_t count) { progress->Advance(count); });
  }

  void Advance(uint64_t bytes) {
    position_ += bytes;
    if (position_ > kLargestSize) {
      throw BadInput(order_.output, "would have 2 GiB or more; leave files out");
    }
  }

  const PackOrder& order_;
  PackageDescription description_;
  PackageHeader header_ = {};
  std::vector<FileRecord> records_;
  std::map<std::string, int> targets_;  // key of a place to the line that fills it
  uint64_t sizes_ = 0;                  // of all files
  uint64_t position_ = 0;               // in the output
};

}  // namespace

void PackImage(const PackOrder& order) {
  ImageBuilder(order).Build();
}

}  // namespace image
