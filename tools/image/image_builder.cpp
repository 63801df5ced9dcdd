#include "tools/image/image_builder.h"

#include <cstring>

#include "tools/image/bad_input.h"
#include "tools/image/executable_part.h"
#include "tools/image/host_text.h"
#include "tools/image/image_contents.h"
#include "tools/image/make_rule.h"
#include "tools/image/output_file.h"
#include "tools/image/package_description.h"
#include "tools/image/parallel_packer.h"
#include "tools/image/progress_bar.h"
#include "tools/image/record_maker.h"
#include "tools/image/record_text.h"
#include "tools/image/stream_format.h"
#include "tools/image/stream_packer.h"

namespace image {
namespace {

class ImageBuilder {
 public:
  explicit ImageBuilder(const PackOrder& order)
      : order_(order),
        faults_(order.description),
        description_(ReadDescription(order.description, order.sourceFolder, &faults_)) {}

  PackReport Build() {
    made_ = MakeRecords(description_, order_.allowUnknownMacros, &faults_);
    CheckStub();
    CheckOutputs();
    faults_.ThrowIfAny();
    FillHeader();

    const InputFile stub(order_.stub);
    OutputFile output(order_.output, FileKind::kProgram);
    CopyExecutable(stub, stub.Size(), &output);
    position_ = stub.Size();
    WriteRecords(&output);
    header_.dataOffset = static_cast<uint32_t>(stub.Size());
    header_.packageLength =
        static_cast<uint32_t>(description_.isRemoval ? made_.records.size() * sizeof(FileRecord)
                                                     : position_ + sizeof header_ - stub.Size());
    Advance(sizeof header_);
    output.Write(BytesOf(header_));
    if (!order_.makeRule.empty()) WriteMakeRule();
    output.Commit();
    return Report();
  }

 private:
  void CheckStub() {
    try {
      RequireSetupProgram(order_.stub);
    } catch (const BadInput& fault) {
      faults_.Add(fault);
    }
  }

  // Nothing that is written takes the place of anything that is read.
  void CheckOutputs() {
    for (const auto& [output, what] : {std::pair(order_.output, "the output"),
                                       std::pair(order_.makeRule, "the file of --depfile")}) {
      if (output.empty()) continue;
      for (const auto& input : {order_.description, order_.stub}) {
        if (IsSameFile(input, output))
          faults_.Add(BadInput(output, "is the input itself; name another output"));
      }
      for (const FileDescription& file : description_.files) {
        std::error_code error;  // one that isn't there can't be written over
        if (!std::filesystem::equivalent(description_.SourceOf(file), output, error)) continue;
        faults_.Add(file.sourceLine, "\"source\" \"" + TextOf(file.source) + "\" is " + what +
                                         " itself; name another output");
      }
    }
    if (!order_.makeRule.empty() && IsSameFile(order_.output, order_.makeRule)) {
      faults_.Add(BadInput(order_.makeRule, "is to be the image already; name another --depfile"));
    }
  }

  void FillHeader() {
    header_.headerSize = sizeof header_;
    std::memcpy(header_.magic, kPackageMagic, sizeof kPackageMagic);
    header_.recordCount = static_cast<uint16_t>(made_.records.size());
    header_.removalImageFlag = description_.isRemoval ? 1 : 0;
    header_.spaceNeeded =
        description_.spaceNeeded.value_or(static_cast<uint32_t>(made_.spaceNeeded));
    (void)SetFieldText(header_.defaultDirectory, description_.defaultDirectory.text);  // checked
    header_.defaultLanguage = description_.defaultLanguage;
  }

  void WriteRecords(OutputFile* output) {
    ProgressBar progress("packing", made_.sizes);
    ParallelPacker packer(description_.isRemoval ? 0 : made_.records.size(),
                          [&](size_t i) { return PackSource(i, &progress); });
    for (size_t i = 0; i < made_.records.size(); ++i) {
      FileRecord& record = made_.records[i];
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
    const std::filesystem::path source = description_.SourceOf(description_.files[i]);
    const std::vector<uint8_t> bytes = ReadWholeFile(source, kLargestSize);
    if (bytes.size() != made_.records[i].fileSize)
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

  void WriteMakeRule() const {
    std::vector<std::filesystem::path> inputs = {order_.description, order_.stub};
    for (const FileDescription& file : description_.files)
      inputs.push_back(description_.SourceOf(file));
    const std::string rule = MakeRule(order_.output, inputs);
    OutputFile output(order_.makeRule, FileKind::kData);
    output.Write({reinterpret_cast<const uint8_t*>(rule.data()), rule.size()});
    output.Commit();
  }

  PackReport Report() const {
    PackReport report;
    for (const FileRecord& record : made_.records) {
      report.files.push_back({FieldText(record.fileName), FieldText(record.destination),
                              record.fileSize, record.storedSize});
    }
    report.imageSize = position_;
    report.warnings = faults_.Warnings();
    return report;
  }

  const PackOrder& order_;
  FaultList faults_;
  PackageDescription description_;
  PackageHeader header_ = {};
  PackageRecords made_;
  uint64_t position_ = 0;  // in the output
};

}  // namespace

PackReport PackImage(const PackOrder& order) {
  return ImageBuilder(order).Build();
}

}  // namespace image
