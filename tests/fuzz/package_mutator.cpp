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
#include "tools/image/record_text.h"

extern "C" size_t LLVMFuzzerMutate(uint8_t* data, size_t size, size_t maxSize);
extern "C" size_t LLVMFuzzerCustomMutator(uint8_t* data, size_t size, size_t maxSize,
                                          unsigned seed);

namespace {

constexpr size_t kMostRecords = 6;
constexpr size_t kLongestStream = 2000;

void Mutate(std::string* bytes, size_t maxSize) {
  const size_t size = bytes->size();
  bytes->resize(std::max(size, maxSize));
  bytes->resize(LLVMFuzzerMutate(reinterpret_cast<uint8_t*>(bytes->data()), size, bytes->size()));
}

// A field keeps its width.
template <size_t N>
void MutateText(char (&field)[N]) {
  std::string text = image::FieldText(field);
  Mutate(&text, N);
  SetField(field, text);
}

template <typename Record>
void MutateBytes(Record* record) {
  auto* const bytes = reinterpret_cast<uint8_t*>(record);
  (void)LLVMFuzzerMutate(bytes, sizeof(Record), sizeof(Record));
}

void MutatePackage(ImageBuilder* package, std::minstd_rand& random) {
  std::vector<ImageBuilder::Piece>& pieces = package->pieces();
  const size_t kind = random() % 16;
  if (kind == 0) return MutateText(package->header().defaultDirectory);
  if (kind == 1) return MutateBytes(&package->header());
  if (pieces.empty()) pieces.emplace_back();
  ImageBuilder::Piece& piece = pieces[random() % pieces.size()];
  if (kind == 2 && pieces.size() < kMostRecords)
    return pieces.push_back(ImageBuilder::Piece(piece));
  if (kind == 3) return void(pieces.erase(pieces.begin() + (&piece - pieces.data())));
  if (kind == 4) return MutateBytes(&piece.record);
  if (kind < 8) return MutateText(piece.record.fileName);
  if (kind < 12) return MutateText(piece.record.destination);
  Mutate(&piece.stream, kLongestStream);
  if (piece.stream.size() > kStreamMagicSize)
    piece.stream.replace(0, kStreamMagicSize, kStreamMagic);
}

}  // namespace

size_t LLVMFuzzerCustomMutator(uint8_t* data, size_t size, size_t maxSize, unsigned seed) {
  std::minstd_rand random(seed);
  if (random() % 8 == 0 || size == 0) return LLVMFuzzerMutate(data, size, maxSize);
  if (random() % 16 == 0) data[0] = static_cast<uint8_t>(random());
  static const std::string stub = VersionedProgram("4.1.7");
  // Whatever the bytes are, they are taken as a package.
  ImageBuilder package = ImageBuilder::TakenApart(stub + std::string(data + 1, data + size),
                                                  stub.size(), kMostRecords);
  MutatePackage(&package, random);
  const std::string bytes = package.Bytes().substr(stub.size());
  if (bytes.size() + 1 > maxSize) return LLVMFuzzerMutate(data, size, maxSize);
  std::memcpy(data + 1, bytes.data(), bytes.size());
  return bytes.size() + 1;
}
