// Images for the program to run from: a small executable with a version resource, and behind it the
// package.
#pragma once

#include <algorithm>
#include <cstring>
#include <functional>
#include <random>
#include <string>
#include <string_view>
#include <vector>

#include "package/package_format.h"
#include "tests/support/executable_builder.h"
#include "tests/support/test_machine.h"
#include "tools/image/stream_packer.h"

// The stream of a file's bytes.
inline std::string PackStream(std::string_view bytes,
                              const image::PackMethod& method = image::kPackFast,
                              const std::function<void(size_t)>& progress = {}) {
  const auto* const first = reinterpret_cast<const uint8_t*>(bytes.data());
  const std::vector<uint8_t> stream = image::PackStream({first, bytes.size()}, method, progress);
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

// A program that a package can go behind: with the dialog, and the log's name as text 137.
inline std::string SetupStub(const std::string& logName = "MorivLog.txt") {
  const std::string version = VersionResource({{"FileVersion", "1.0.0"}});
  ByteBuilder texts;
  texts.PadTo(137 % 16 * 2).U16(logName.size()).Wide(logName);
  return PortableExecutable(false, {{5, 116, {{0, "dialog"}}},
                                    {6, 137 / 16 + 1, {{0, texts.bytes()}}},
                                    {16, 1, {{0x40C, version}}}});
}

// A text that fills a record's field has no NUL.
template <size_t N>
void SetField(char (&field)[N], std::string_view text) {
  std::memset(field, 0, N);
  text.copy(field, N);
}

// An image piece by piece: made from nothing or taken apart, changed at will, and put together.
class ImageBuilder {
 public:
  struct Piece {
    FileRecord record = {};
    std::string stream;
  };

  explicit ImageBuilder(const std::string& version = "4.1.7")
      : executable_(VersionedProgram(version)) {
    header_.defaultLanguage = -1;
  }

  // The pieces that a walk over the records reaches: from `offset` on, at most `count`, as long as
  // they are whole. The last stream may be cut short; what follows it is dropped.
  static ImageBuilder TakenApart(const std::string& bytes, uint64_t offset, size_t count) {
    ImageBuilder image;
    image.header_ = HeaderOf(bytes);
    image.executable_ = bytes.substr(0, offset);
    while (count-- > 0 && offset <= bytes.size() && bytes.size() - offset >= sizeof(FileRecord)) {
      Piece& piece = image.pieces_.emplace_back();
      bytes.copy(reinterpret_cast<char*>(&piece.record), sizeof(FileRecord), offset);
      offset += sizeof(FileRecord);
      if (offset < bytes.size()) piece.stream = bytes.substr(offset, piece.record.storedSize);
      offset += piece.record.storedSize;
    }
    return image;
  }

  // The same from where its header says.
  static ImageBuilder TakenApart(const std::string& bytes) {
    const PackageHeader header = HeaderOf(bytes);
    return TakenApart(bytes, header.dataOffset, header.recordCount);
  }

  // A file with a version of 4.1.7.
  ImageBuilder& Add(std::string_view name, std::string_view destination, std::string_view bytes) {
    Piece& piece = pieces_.emplace_back();
    SetField(piece.record.fileName, name);
    SetField(piece.record.destination, destination);
    piece.record.versionFirst = 4;
    piece.record.versionSecond = 1;
    piece.record.versionThird = 7;
    piece.record.fileSize = static_cast<uint32_t>(bytes.size());
    piece.stream = PackStream(bytes);
    return *this;
  }

  std::string& executable() { return executable_; }
  std::vector<Piece>& pieces() { return pieces_; }
  PackageHeader& header() { return header_; }

  // As it stands, whatever its fields say.
  std::string RawBytes() const {
    std::string image = executable_;
    for (const Piece& piece : pieces_) {
      image.append(reinterpret_cast<const char*>(&piece.record), sizeof(FileRecord));
      image += piece.stream;
    }
    return image.append(reinterpret_cast<const char*>(&header_), sizeof(PackageHeader));
  }

  // With the magic and all sizes, counts and offsets put right.
  std::string Bytes() const {
    ImageBuilder image = *this;
    for (Piece& piece : image.pieces_) {
      piece.record.recordSize = sizeof(FileRecord);
      piece.record.storedSize = static_cast<uint32_t>(piece.stream.size());
    }
    image.header_.headerSize = sizeof(PackageHeader);
    SetField(image.header_.magic, kPackageMagic);
    image.header_.recordCount = static_cast<uint16_t>(pieces_.size());
    image.header_.dataOffset = static_cast<uint32_t>(executable_.size());
    image.header_.packageLength =
        static_cast<uint32_t>(image.RawBytes().size() - executable_.size());
    return image.RawBytes();
  }

  // Writes the image as C:\setup.exe and starts the machine anew for it.
  void Write(TestMachine* pc) const {
    pc->Write("drive_c/setup.exe", Bytes());
    pc->Restart("drive_c/setup.exe");
  }

 private:
  // The last bytes; of an image that is shorter than a header zeros follow.
  static PackageHeader HeaderOf(const std::string& bytes) {
    PackageHeader header = {};
    const size_t size = std::min(bytes.size(), sizeof(header));
    bytes.copy(reinterpret_cast<char*>(&header), size, bytes.size() - size);
    return header;
  }

  std::string executable_;
  std::vector<Piece> pieces_;
  PackageHeader header_ = {};
};
