// How an engine changes inputs that hold a package behind one byte of options: piece by piece, with
// the sizes, the magics and the places put right afterwards, so that it gets behind the reader's
// first tests. One change in eight is made to the bytes as they are.
#include <algorithm>
#include <cstring>
#include <random>
#include <string>
#include <vector>

#include "package/expander.h"
#include "package/package_format.h"
#include "tests/support/test_image.h"

extern "C" size_t LLVMFuzzerMutate(uint8_t* data, size_t size, size_t maxSize);
extern "C" size_t LLVMFuzzerCustomMutator(uint8_t* data, size_t size, size_t maxSize,
                                          unsigned seed);

namespace {

constexpr size_t kMostRecords = 6;
constexpr size_t kLongestStream = 2000;

struct Piece {
  FileRecord record;
  std::string stream;
};

struct Package {
  std::vector<Piece> pieces;
  PackageHeader header;
};

template <typename Record>
Record ReadAt(const std::string& bytes, size_t offset) {
  Record record = {};
  std::memcpy(&record, bytes.data() + offset, std::min(sizeof(record), bytes.size() - offset));
  return record;
}

// Whatever the bytes are, they are taken as a package.
Package Parse(const std::string& bytes) {
  Package package = {};
  const size_t end = bytes.size() - std::min(bytes.size(), sizeof(PackageHeader));
  package.header = ReadAt<PackageHeader>(bytes, end);
  for (size_t offset = 0;
       end - offset >= sizeof(FileRecord) && package.pieces.size() < kMostRecords;) {
    Piece piece = {ReadAt<FileRecord>(bytes, offset), ""};
    offset += sizeof(FileRecord);
    const size_t stored = std::min<size_t>(piece.record.storedSize, end - offset);
    piece.stream = bytes.substr(offset, stored);
    offset += stored;
    package.pieces.push_back(piece);
  }
  return package;
}

std::string Write(const Package& package) {
  ImageBuilder image;
  PackageHeader& header = image.header();
  const PackageHeader good = header;
  header = package.header;
  header.headerSize = good.headerSize;
  std::memcpy(header.magic, good.magic, sizeof(good.magic));
  for (const auto& [record, packed] : package.pieces) {
    std::string stream = packed;
    if (stream.size() > kStreamMagicSize) stream.replace(0, kStreamMagicSize, kStreamMagic);
    image.AddStream("", "", stream);
    FileRecord& added = image.LastRecord();
    const uint32_t storedSize = added.storedSize;
    added = record;
    added.recordSize = sizeof(FileRecord);
    added.storedSize = storedSize;
  }
  return image.Bytes().substr(image.executable().size());
}

void Mutate(std::string* bytes, size_t maxSize) {
  const size_t size = bytes->size();
  bytes->resize(std::max(size, maxSize));
  bytes->resize(LLVMFuzzerMutate(reinterpret_cast<uint8_t*>(bytes->data()), size, bytes->size()));
}

// A field keeps its width: a text that fills it has no NUL.
template <size_t N>
void MutateText(char (&field)[N]) {
  std::string text(field, std::find(field, field + N, '\0'));
  Mutate(&text, N);
  std::memset(field, 0, N);
  text.copy(field, N);
}

template <typename Record>
void MutateBytes(Record* record) {
  auto* const bytes = reinterpret_cast<uint8_t*>(record);
  (void)LLVMFuzzerMutate(bytes, sizeof(Record), sizeof(Record));
}

void MutatePackage(Package* package, std::minstd_rand& random) {
  std::vector<Piece>& pieces = package->pieces;
  const size_t kind = random() % 16;
  if (kind == 0) return MutateText(package->header.defaultDirectory);
  if (kind == 1) return MutateBytes(&package->header);
  if (pieces.empty()) pieces.emplace_back();
  Piece& piece = pieces[random() % pieces.size()];
  if (kind == 2 && pieces.size() < kMostRecords) return pieces.push_back(Piece(piece));
  if (kind == 3) return void(pieces.erase(pieces.begin() + (&piece - pieces.data())));
  if (kind == 4) return MutateBytes(&piece.record);
  if (kind < 8) return MutateText(piece.record.fileName);
  if (kind < 12) return MutateText(piece.record.destination);
  Mutate(&piece.stream, kLongestStream);
}

}  // namespace

size_t LLVMFuzzerCustomMutator(uint8_t* data, size_t size, size_t maxSize, unsigned seed) {
  std::minstd_rand random(seed);
  if (random() % 8 == 0 || size == 0) return LLVMFuzzerMutate(data, size, maxSize);
  if (random() % 16 == 0) data[0] = static_cast<uint8_t>(random());
  Package package = Parse(std::string(data + 1, data + size));
  MutatePackage(&package, random);
  const std::string bytes = Write(package);
  if (bytes.size() + 1 > maxSize) return LLVMFuzzerMutate(data, size, maxSize);
  std::memcpy(data + 1, bytes.data(), bytes.size());
  return bytes.size() + 1;
}
