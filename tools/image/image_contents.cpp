#include "tools/image/image_contents.h"

#include <algorithm>
#include <cstring>

#include "tools/image/bad_input.h"

namespace image {
namespace {

template <class Record>
Record ReadRecord(const InputFile& file, uint64_t offset) {
  uint8_t bytes[sizeof(Record)];
  file.Read(offset, bytes);
  Record record;
  std::memcpy(&record, bytes, sizeof record);
  return record;
}

std::string RecordAt(size_t number, uint64_t offset) {
  return "record " + std::to_string(number) + " at offset " + std::to_string(offset);
}

// The records in front of the header; "" or what ended the walk.
std::string WalkRecords(const InputFile& file, ImageContents* contents) {
  const uint64_t end = contents->headerOffset;
  uint64_t offset = contents->header.dataOffset;
  if (offset > end) {
    return "dataOffset " + std::to_string(offset) + " lies behind the header's own place " +
           std::to_string(end);
  }
  for (size_t number = 1; number <= contents->header.recordCount; ++number) {
    if (end - offset < sizeof(FileRecord)) {
      return RecordAt(number, offset) + " reaches into the header at offset " + std::to_string(end);
    }
    const PackagedFile packaged{offset, ReadRecord<FileRecord>(file, offset)};
    if (packaged.record.recordSize != sizeof(FileRecord)) {
      return RecordAt(number, offset) + " has a recordSize of " +
             std::to_string(packaged.record.recordSize) + " instead of 696";
    }
    if (packaged.End() > end) {
      return RecordAt(number, offset) + " has a stream of " +
             std::to_string(packaged.record.storedSize) +
             " bytes that reaches into the header at offset " + std::to_string(end);
    }
    offset = packaged.End();
    contents->files.push_back(packaged);
  }
  return "";
}

}  // namespace

std::optional<PackageHeader> FindHeader(const InputFile& file) {
  if (file.Size() < sizeof(PackageHeader)) return std::nullopt;
  const auto header = ReadRecord<PackageHeader>(file, file.Size() - sizeof(PackageHeader));
  if (header.headerSize != sizeof(PackageHeader) ||
      std::memcmp(header.magic, kPackageMagic, sizeof kPackageMagic) != 0) {
    return std::nullopt;
  }
  return header;
}

ImageContents ReadContents(const InputFile& file) {
  const std::optional<PackageHeader> header = FindHeader(file);
  if (!header) {
    throw BadInput(file.Path(), "has no package at its end; name an image that pack has made");
  }
  ImageContents contents;
  contents.header = *header;
  contents.headerOffset = file.Size() - sizeof(PackageHeader);
  contents.damage = WalkRecords(file, &contents);
  return contents;
}

ImageContents ReadWholeContents(const InputFile& file) {
  ImageContents contents = ReadContents(file);
  if (!contents.damage.empty()) {
    throw BadInput(file.Path(), contents.damage + "; the image is damaged, make it anew");
  }
  return contents;
}

StreamReader OpenStream(const InputFile& file, const PackagedFile& packaged) {
  return StreamReader([&file, offset = packaged.StreamOffset(),
                       end = packaged.End()](std::span<uint8_t> bytes) mutable {
    const auto count = static_cast<size_t>(std::min<uint64_t>(bytes.size(), end - offset));
    file.Read(offset, bytes.first(count));
    offset += count;
    return count;
  });
}

std::string ExpandFile(const InputFile& file, const PackagedFile& packaged,
                       const std::function<void(std::span<const uint8_t>)>& take) {
  const uint64_t expected = packaged.record.fileSize;
  StreamReader reader = OpenStream(file, packaged);
  uint64_t size = 0;
  for (auto piece = reader.Next(); !piece.empty(); piece = reader.Next()) {
    size += piece.size();
    if (size > expected)
      return "the stream expands to more than the fileSize " + std::to_string(expected);
    take(piece);
  }
  if (!reader.Fault().empty()) return "after " + std::to_string(size) + " bytes " + reader.Fault();
  if (size == expected) return "";
  return "the stream expands to " + std::to_string(size) + " bytes, fileSize is " +
         std::to_string(expected);
}

}  // namespace image
