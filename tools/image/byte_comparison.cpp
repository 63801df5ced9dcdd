#include "tools/image/byte_comparison.h"

#include <algorithm>

#include "tools/image/bad_input.h"
#include "tools/image/record_text.h"
#include "tools/image/stream_reader.h"

namespace image {
namespace {

// The bytes of one stream, as many at a time as the other side can take.
class ExpandedBytes {
 public:
  ExpandedBytes(const InputFile& image, const PackagedFile& packaged)
      : image_(image), packaged_(packaged), reader_(OpenStream(image, packaged)) {}

  // What has been expanded and not yet been taken; empty at the end.
  std::span<const uint8_t> Rest() {
    if (rest_.empty()) Expand();
    return rest_;
  }
  void Drop(size_t count) { rest_ = rest_.subspan(count); }

 private:
  void Expand() {
    rest_ = reader_.Next();
    size_ += rest_.size();
    const bool isAtEnd = rest_.empty();
    if (!reader_.Fault().empty()) Fail(reader_.Fault());
    if (size_ > packaged_.record.fileSize || (isAtEnd && size_ < packaged_.record.fileSize)) {
      Fail("the stream has another size than the record");
    }
  }

  [[noreturn]] void Fail(const std::string& fault) const {
    throw BadInput(image_.Path(), "file " + Shown(FieldText(packaged_.record.fileName)) + ": " +
                                      fault + "; the image is damaged, make it anew");
  }

  const InputFile& image_;
  const PackagedFile& packaged_;
  StreamReader reader_;
  std::span<const uint8_t> rest_;
  uint64_t size_ = 0;
};

}  // namespace

bool HaveEqualBytes(const InputFile& first, const InputFile& second, uint64_t size) {
  std::vector<uint8_t> firstBlock(65536);
  std::vector<uint8_t> secondBlock(65536);
  for (uint64_t offset = 0; offset < size;) {
    const auto count = static_cast<size_t>(std::min<uint64_t>(firstBlock.size(), size - offset));
    const std::span firstPart = std::span(firstBlock).first(count);
    const std::span secondPart = std::span(secondBlock).first(count);
    first.Read(offset, firstPart);
    second.Read(offset, secondPart);
    if (!std::ranges::equal(firstPart, secondPart)) return false;
    offset += count;
  }
  return true;
}

bool ExpandToEqualBytes(const InputFile& firstImage, const PackagedFile& first,
                        const InputFile& secondImage, const PackagedFile& second) {
  if (first.record.fileSize != second.record.fileSize) return false;
  ExpandedBytes a(firstImage, first);
  ExpandedBytes b(secondImage, second);
  for (;;) {
    const size_t count = std::min(a.Rest().size(), b.Rest().size());
    if (count == 0) return true;  // of one size, they end together
    if (!std::ranges::equal(a.Rest().first(count), b.Rest().first(count))) return false;
    a.Drop(count);
    b.Drop(count);
  }
}

}  // namespace image
