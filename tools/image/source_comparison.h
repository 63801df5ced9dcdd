// An image against the description and the sources that it was made of: what no checksum in the
// image itself could show.
#pragma once

#include <cstdint>
#include <filesystem>
#include <functional>
#include <memory>
#include <optional>
#include <span>
#include <string>
#include <vector>

#include "package/package_format.h"
#include "tools/image/input_file.h"
#include "tools/image/package_description.h"
#include "tools/image/record_maker.h"

namespace image {

using FaultTeller = std::function<void(const std::string&)>;

// Holds the bytes of one stream, as they come, against a source.
class SourceBytes {
 public:
  explicit SourceBytes(const std::filesystem::path& source) : file_(source) {}

  void Take(std::span<const uint8_t> piece);
  // What differs in the bytes taken, "" when nothing does.
  std::string Fault() const;

 private:
  InputFile file_;
  uint64_t taken_ = 0;
  std::optional<uint64_t> firstDifference_;
  std::vector<uint8_t> block_;
};

class SourceComparison {
 public:
  // Throws BadInput or BadInputs for a description or a source that can't be used.
  SourceComparison(const std::filesystem::path& description, const std::filesystem::path& folder);

  void CompareHeader(const PackageHeader& header, const FaultTeller& tell) const;
  // The image's record number `index`, from 0; true when the description has one of that number and
  // name, whose bytes can be compared.
  bool CompareRecord(size_t index, const FileRecord& record, const FaultTeller& tell) const;
  // Of the source of a record.
  std::unique_ptr<SourceBytes> OpenSource(size_t index) const;

 private:
  PackageDescription description_;
  PackageRecords made_;
};

}  // namespace image
