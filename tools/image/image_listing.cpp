#include "tools/image/image_listing.h"

#include <algorithm>
#include <array>
#include <nlohmann/json.hpp>
#include <vector>

#include "tools/image/host_text.h"
#include "tools/image/image_contents.h"
#include "tools/image/language_names.h"
#include "tools/image/record_text.h"
#include "tools/image/record_version.h"

namespace image {
namespace {

constexpr size_t kColumns = 8;
using Row = std::array<std::string, kColumns>;
constexpr std::array<bool, kColumns> kIsNumber = {true, true,  true,  true,
                                                  true, false, false, false};

Row DescribeRecord(size_t number, const PackagedFile& file) {
  const FileRecord& record = file.record;
  return {std::to_string(number),
          std::to_string(file.offset),
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

std::string HeaderLine(const std::string& label, const std::string& value) {
  return label + std::string(20 - label.size(), ' ') + value + '\n';
}

const char* KindOf(const PackageHeader& header) {
  return header.removalImageFlag == 1 ? "removal program" : "setup image";
}

std::string DescribeHeader(const PackageHeader& header, uint64_t headerOffset) {
  return HeaderLine("kind", KindOf(header)) +
         HeaderLine("records", std::to_string(header.recordCount)) +
         HeaderLine("space needed", std::to_string(header.spaceNeeded)) +
         HeaderLine("package length", std::to_string(header.packageLength)) +
         HeaderLine("executable", std::to_string(header.dataOffset)) +
         HeaderLine("header at", std::to_string(headerOffset)) +
         HeaderLine("default directory", Shown(FieldText(header.defaultDirectory))) +
         HeaderLine("default language", DescribeLanguage(header.defaultLanguage));
}

Json RecordAsJson(const PackagedFile& file) {
  const FileRecord& record = file.record;
  return {{"offset", file.offset},
          {"size", record.fileSize},
          {"stored", record.storedSize},
          {"version", DescribeVersion(record)},
          {"language", Utf8Text(record.versionLanguage)},
          {"name", Utf8Text(record.fileName)},
          {"destination", Utf8Text(record.destination)}};
}

}  // namespace

std::string ListImage(const std::filesystem::path& image) {
  const InputFile file(image);
  const ImageContents contents = ReadWholeContents(file);
  std::string text = DescribeHeader(contents.header, contents.headerOffset);
  if (contents.files.empty()) return text;
  std::vector<Row> rows = {
      {"#", "offset", "size", "stored", "version", "language", "name", "destination"}};
  for (const PackagedFile& packaged : contents.files) {
    rows.push_back(DescribeRecord(rows.size(), packaged));
  }
  return text + '\n' + LayOut(rows);
}

Json ListImageAsJson(const std::filesystem::path& image) {
  const InputFile file(image);
  const ImageContents contents = ReadWholeContents(file);
  const PackageHeader& header = contents.header;
  Json records = Json::array();
  for (const PackagedFile& packaged : contents.files) records.push_back(RecordAsJson(packaged));
  return {{"image", TextOf(image)},
          {"kind", KindOf(header)},
          {"spaceNeeded", header.spaceNeeded},
          {"packageLength", header.packageLength},
          {"executable", header.dataOffset},
          {"headerAt", contents.headerOffset},
          {"defaultDirectory", Utf8Text(header.defaultDirectory)},
          {"defaultLanguage", header.defaultLanguage},
          {"records", records}};
}

}  // namespace image
