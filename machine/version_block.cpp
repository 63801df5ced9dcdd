#include "machine/version_block.h"

#include <algorithm>

#include "machine/bounded_bytes.h"
#include "machine/code_page.h"

namespace machine {
namespace {

using Bytes = std::span<const uint8_t>;

constexpr size_t kFixedHeader = 6;
constexpr std::string_view kRootKey = "VS_VERSION_INFO";

struct Block {
  size_t end = 0;
  std::string key;
  VersionValue value;
  size_t firstChild = 0;
};

// The UTF-16 text that ends at a NUL or at `end`, whichever comes first.
std::u16string TextAt(Bytes bytes, size_t offset, size_t end) {
  BoundedBytes resource(bytes);
  std::u16string text;
  for (; offset + 2 <= end; offset += 2) {
    const uint16_t unit = resource.U16(offset);
    if (unit == 0) break;
    text.push_back(static_cast<char16_t>(unit));
  }
  return text;
}

// The block at `offset`, which lies in front of `limit`.
std::optional<Block> ReadBlock(Bytes bytes, size_t offset, size_t limit) {
  BoundedBytes resource(bytes);
  const size_t length = resource.U16(offset);
  const size_t valueLength = resource.U16(offset + 2);
  const bool isText = resource.U16(offset + 4) == 1;
  if (!resource.good() || length < kFixedHeader || length > limit - offset) return std::nullopt;

  Block block;
  block.end = offset + length;
  const std::u16string key = TextAt(bytes, offset + kFixedHeader, block.end);
  block.key = FromUtf16(key);
  const size_t keyEnd = offset + kFixedHeader + (key.size() + 1) * 2;
  if (keyEnd > block.end) return std::nullopt;

  block.firstChild = block.end;
  if (valueLength == 0) {
    block.value.offset = std::min(AlignUp(keyEnd), block.end);
    block.firstChild = block.value.offset;
    return block;
  }
  block.value.offset = AlignUp(keyEnd);
  block.value.isText = isText;
  if (block.value.offset > block.end) return std::nullopt;
  // Some compilers give the length of a text in bytes, twice too much: it ends at its NUL then, and
  // at the block's end at the latest.
  const size_t room = block.end - block.value.offset;
  const size_t size = isText ? std::min(valueLength * 2, room) : valueLength;
  if (size > room) return std::nullopt;
  block.value.size =
      isText ? TextAt(bytes, block.value.offset, block.value.offset + size).size() * 2 : size;
  block.firstChild = std::min(AlignUp(block.value.offset + size), block.end);
  return block;
}

std::optional<Block> ReadRoot(Bytes resource) {
  std::optional<Block> root = ReadBlock(resource, 0, resource.size());
  if (!root || root->key != kRootKey) return std::nullopt;
  return root;
}

// A block has 6 bytes at least, so that each turn goes on.
std::optional<Block> FindChild(Bytes resource, const Block& parent, std::string_view key) {
  size_t offset = parent.firstChild;
  while (offset < parent.end) {
    std::optional<Block> child = ReadBlock(resource, offset, parent.end);
    if (!child || EqualNoCase(child->key, key)) return child;
    offset = AlignUp(child->end);
  }
  return std::nullopt;
}

}  // namespace

bool IsVersionBlock(Bytes resource) {
  return ReadRoot(resource).has_value();
}

std::optional<VersionValue> FindVersionValue(Bytes resource, std::string_view path) {
  std::optional<Block> block = ReadRoot(resource);
  while (block && !path.empty()) {
    const size_t end = std::min(path.find('\\'), path.size());
    const std::string_view key = path.substr(0, end);
    path.remove_prefix(std::min(end + 1, path.size()));
    if (!key.empty()) block = FindChild(resource, *block, key);
  }
  if (!block) return std::nullopt;
  return block->value;
}

std::string VersionText(Bytes resource, const VersionValue& value) {
  return FromUtf16(TextAt(resource, value.offset, value.offset + value.size));
}

}  // namespace machine
