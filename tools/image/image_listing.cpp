#include "tools/image/image_listing.h"

#include <algorithm>
#include <array>
#include <cstdio>
#include <vector>

#include "tools/image/image_contents.h"
#include "tools/image/language_names.h"
#include "tools/image/record_text.h"

namespace image {
namespace {

constexpr size_t kColumns = 7;
using Row = std::array<std::string, kColumns>;
constexpr std::array<bool, kColumns> kIsNumber = {true, true, true, true, false, false, false};

std::string DescribeVersion(const FileRecord& record) {
  const int16_t fields[] = {record.versionFirst, record.versionSecond, record.versionThird};
  std::string text;
  for (const int16_t field : fields) {
    if (!text.empty()) text += '.';
    text += field == kVersionNotSet ? "-" : std::to_string(field);
  }
  return text;
}

Row DescribeRecord(const PackagedFile& file) {
  const FileRecord& record = file.record;
  return {std::to_string(file.offset),
          std::to_string(record.fileSize),
          std::to_string(record.storedSize),
          DescribeVersion(record),
          Shown(FieldText(record.versionLanguage)),
          Shown(FieldText(record.fileName)),
          Shown(FieldText(record.destination))};
}

// Characters on the screen, not bytes, of a UTF-8 text.
size_t ShownWidth(const std::string& text) {
  return static_cast<size_t>(
      std::count_if(text.begin(), text.end(), [](char c) { return (c & 0xC0) != 0x80; }));
}

std::string LayOut(const std::vector<Row>& rows) {
  std::array<size_t, kColumns> widths = {};
  for (const Row& row : rows) {
    for (size_t i = 0; i < kColumns; ++i) widths[i] = std::max(widths[i], ShownWidth(row[i]));
  }
  std::string text;
  for (const Row& row : rows) {
    for (size_t i = 0; i < kColumns; ++i) {
      const bool isLast = i + 1 == kColumns;
      const std::string blanks(widths[i] - ShownWidth(row[i]), ' ');
      text += kIsNumber[i] ? blanks + row[i] : row[i] + (isLast ? "" : blanks);
      text += isLast ? "\n" : "  ";
    }
  }
  return text;
}

std::string Line(const std::string& label, const std::string& value) {
  return label + std::string(20 - label.size(), ' ') + value + '\n';
}

std::string DescribeHeader(const PackageHeader& header, uint64_t headerOffset) {
  return Line("kind", header.removalImageFlag == 1 ? "removal program" : "setup image") +
         Line("records", std::to_string(header.recordCount)) +
         Line("space needed", std::to_string(header.spaceNeeded)) +
         Line("package length", std::to_string(header.packageLength)) +
         Line("executable", std::to_string(header.dataOffset)) +
         Line("header at", std::to_string(headerOffset)) +
         Line("default directory", Shown(FieldText(header.defaultDirectory))) +
         Line("default language", DescribeLanguage(header.defaultLanguage));
}

}  // namespace

std::string ListImage(const std::filesystem::path& image) {
  const InputFile file(image);
  const ImageContents contents = ReadWholeContents(file);
  std::string text = DescribeHeader(contents.header, contents.headerOffset);
  if (contents.files.empty()) return text;
  std::vector<Row> rows = {
      {"offset", "size", "stored", "version", "language", "name", "destination"}};
  for (const PackagedFile& packaged : contents.files) rows.push_back(DescribeRecord(packaged));
  return text + '\n' + LayOut(rows);
}

}  // namespace image
