// Images for the program to run from: a small executable with a version resource, and behind it the
// package.
#pragma once

#include <cstring>
#include <random>
#include <string>
#include <string_view>
#include <vector>

#include "package/package_format.h"
#include "tests/support/executable_builder.h"
#include "tests/support/test_machine.h"
#include "tools/image/stream_packer.h"

// The stream of a file's bytes.
inline std::string PackStream(std::string_view bytes) {
  const auto* const first = reinterpret_cast<const uint8_t*>(bytes.data());
  const std::vector<uint8_t> stream = image::PackStream({first, bytes.size()}, image::kPackFast);
  return {stream.begin(), stream.end()};
}

inline std::string RandomBytes(size_t count, unsigned seed) {
  std::mt19937 random(seed);
  std::string bytes(count, '\0');
  for (char& byte : bytes) byte = static_cast<char>(random());
  return bytes;
}

// A program with a version resource of these strings.
inline std::string ProgramWithStrings(
    const std::vector<std::pair<std::string, std::string>>& strings, bool hasTranslation = true) {
  const std::string resource = VersionResource(strings, 0x40C, 0x4B0, hasTranslation);
  return PortableExecutable(false, 16, 1, {{0x40C, resource}});
}

// A program with version `version`; an empty one leaves the version resource out.
inline std::string VersionedProgram(const std::string& version) {
  return version.empty() ? PortableExecutable(false, 6, 1, {{0x40C, ""}})
                         : ProgramWithStrings({{"FileVersion", version}});
}

class ImageBuilder {
 public:
  explicit ImageBuilder(const std::string& version = "4.1.7")
      : executable_(VersionedProgram(version)) {
    header_.headerSize = sizeof(PackageHeader);
    std::memcpy(header_.magic, kPackageMagic, sizeof(header_.magic));
    header_.defaultLanguage = -1;
  }

  // A file with a version of 4.1.7.
  ImageBuilder& Add(std::string_view name, std::string_view destination, std::string_view bytes) {
    AddStream(name, destination, PackStream(bytes));
    records_.back().fileSize = static_cast<uint32_t>(bytes.size());
    return *this;
  }

  ImageBuilder& AddStream(std::string_view name, std::string_view destination,
                          std::string_view stream) {
    FileRecord record = {};
    record.recordSize = sizeof(FileRecord);
    name.copy(record.fileName, sizeof(record.fileName));
    destination.copy(record.destination, sizeof(record.destination));
    record.versionFirst = 4;
    record.versionSecond = 1;
    record.versionThird = 7;
    record.storedSize = static_cast<uint32_t>(stream.size());
    records_.push_back(record);
    streams_.emplace_back(stream);
    return *this;
  }

  // To be changed at will before the image is made.
  PackageHeader& header() { return header_; }
  FileRecord& LastRecord() { return records_.back(); }
  std::string& executable() { return executable_; }

  std::string Bytes() const {
    std::string image = executable_;
    for (size_t i = 0; i < records_.size(); ++i) {
      image.append(reinterpret_cast<const char*>(&records_[i]), sizeof(FileRecord));
      image += streams_[i];
    }
    PackageHeader header = header_;
    header.recordCount = static_cast<uint16_t>(records_.size());
    header.dataOffset = static_cast<uint32_t>(executable_.size());
    header.packageLength =
        static_cast<uint32_t>(image.size() + sizeof(PackageHeader) - executable_.size());
    return image.append(reinterpret_cast<const char*>(&header), sizeof(PackageHeader));
  }

  // Writes the image as C:\setup.exe and starts the machine anew for it.
  void Write(TestMachine* pc) const {
    pc->Write("drive_c/setup.exe", Bytes());
    pc->Restart("drive_c/setup.exe");
  }

 private:
  std::string executable_;
  PackageHeader header_ = {};
  std::vector<FileRecord> records_;
  std::vector<std::string> streams_;
};
