// What stands in an image: its header and its records, walked as the setup program walks them, but
// with every size checked against the file.
#pragma once

#include <cstdint>
#include <functional>
#include <optional>
#include <span>
#include <string>
#include <vector>

#include "package/package_format.h"
#include "tools/image/input_file.h"
#include "tools/image/stream_reader.h"

namespace image {

struct PackagedFile {
  uint64_t offset = 0;  // of the record
  FileRecord record = {};

  uint64_t StreamOffset() const { return offset + sizeof(FileRecord); }
  uint64_t End() const { return StreamOffset() + record.storedSize; }
};

struct ImageContents {
  PackageHeader header = {};
  uint64_t headerOffset = 0;
  std::vector<PackagedFile> files;
  std::string damage;  // why the walk ended before the last record; "" when all were read
};

// A record's bytes as they stand in the image.
template <class Record>
std::span<const uint8_t> BytesOf(const Record& record) {
  return {reinterpret_cast<const uint8_t*>(&record), sizeof record};
}

// The header at the end of a file; nullopt when no package stands there.
std::optional<PackageHeader> FindHeader(const InputFile& file);

// Header and records of an image. Every record and stream listed lies between dataOffset and the
// header. Throws BadInput for a file without a header.
ImageContents ReadContents(const InputFile& file);

// The same for a use that needs them all: throws BadInput for a damaged walk too.
ImageContents ReadWholeContents(const InputFile& file);

// The stream of one record, to be expanded; `file` outlives it.
StreamReader OpenStream(const InputFile& file, const PackagedFile& packaged);

// Expands the stream of one record and hands the bytes over piece by piece, never more than the
// record's fileSize, since some kilobytes can expand to gigabytes. Returns what is wrong with the
// stream or with its length, "" when nothing is; throws BadInput when the image can't be read.
std::string ExpandFile(const InputFile& file, const PackagedFile& packaged,
                       const std::function<void(std::span<const uint8_t>)>& take);

}  // namespace image
