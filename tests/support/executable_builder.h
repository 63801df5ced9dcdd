// Small executables with a version resource, byte by byte, for tests that read them.
#pragma once

#include <cstdint>
#include <cstdio>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

class ByteBuilder {
 public:
  ByteBuilder& U16(uint64_t number) { return Number(number, 2); }
  ByteBuilder& U32(uint64_t number) { return Number(number, 4); }
  ByteBuilder& Append(std::string_view bytes) {
    bytes_ += bytes;
    return *this;
  }
  // ASCII as UTF-16, without a NUL.
  ByteBuilder& Wide(std::string_view text) {
    for (const char byte : text) U16(static_cast<unsigned char>(byte));
    return *this;
  }
  // Zero bytes up to the offset.
  ByteBuilder& PadTo(size_t offset) {
    if (bytes_.size() < offset) bytes_.resize(offset);
    return *this;
  }
  ByteBuilder& Align() { return PadTo((bytes_.size() + 3) & ~size_t{3}); }

  const std::string& bytes() const { return bytes_; }

 private:
  ByteBuilder& Number(uint64_t number, int width) {
    for (int byte = 0; byte < width; ++byte)
      bytes_ += static_cast<char>(number >> (8 * byte) & 255);
    return *this;
  }

  std::string bytes_;
};

// A block of a version resource. Blocks in it begin at multiples of 4, as the block itself must.
inline std::string VersionBlock(std::string_view key, bool isText, size_t valueLength,
                                std::string_view value, const std::vector<std::string>& children) {
  ByteBuilder body;
  body.U16(0).U16(valueLength).U16(isText ? 1 : 0).Wide(key).U16(0).Align().Append(value);
  for (const std::string& child : children) body.Align().Append(child);
  ByteBuilder block;
  return block.U16(body.bytes().size()).Append(std::string_view(body.bytes()).substr(2)).bytes();
}

// A version resource with one string table, named by language and code page, and with a translation
// unless `translation` is false.
inline std::string VersionResource(const std::vector<std::pair<std::string, std::string>>& strings,
                                   uint16_t language = 0x040C, uint16_t codePage = 0x04B0,
                                   bool translation = true) {
  std::vector<std::string> blocks;
  for (const auto& [key, text] : strings) {
    const std::string wide = ByteBuilder().Wide(text).U16(0).bytes();
    blocks.push_back(VersionBlock(key, true, text.size() + 1, wide, {}));
  }
  char name[9];
  std::snprintf(name, sizeof(name), "%04x%04x", unsigned{language}, unsigned{codePage});
  std::vector<std::string> children = {
      VersionBlock("StringFileInfo", true, 0, "", {VersionBlock(name, true, 0, "", blocks)})};
  if (translation) {
    const std::string pair = ByteBuilder().U16(language).U16(codePage).bytes();
    children.push_back(VersionBlock("VarFileInfo", true, 0, "",
                                    {VersionBlock("Translation", false, 4, pair, {})}));
  }
  const std::string fixed = ByteBuilder().U32(0xFEEF04BD).PadTo(52).bytes();
  return VersionBlock("VS_VERSION_INFO", false, fixed.size(), fixed, children);
}

// The resources of one type and id, in languages that each have their own data.
struct ResourceSource {
  uint16_t type, id;
  std::vector<std::pair<uint16_t, std::string>> languages;
};

// A Windows program of headers and one section, which holds resources of ascending types.
//
//   0    "MZ", at 60 the position of the PE header
//   64   PE header, section header
//   512  section: the directory of types, then for each its two directories and the leaves, each
//        with its data
inline std::string PortableExecutable(bool is64, const std::vector<ResourceSource>& resources) {
  constexpr uint32_t kAddress = 0x1000;
  constexpr uint32_t kPosition = 512;
  constexpr uint32_t kDirectory = 0x80000000;

  ByteBuilder types, rest;
  types.PadTo(12).U16(0).U16(resources.size());
  for (const auto& [type, id, languages] : resources) {
    const size_t begin = 16 + 8 * resources.size() + rest.bytes().size();
    types.U32(type).U32(kDirectory | begin);
    ByteBuilder ids, leaves;
    ids.PadTo(12).U16(0).U16(1).U32(id).U32(kDirectory | (begin + 24));
    ids.PadTo(24 + 12).U16(0).U16(languages.size());
    for (const auto& [language, bytes] : languages) {
      const size_t leaf = begin + 24 + 16 + 8 * languages.size() + leaves.bytes().size();
      ids.U32(language).U32(leaf);
      leaves.U32(kAddress + leaf + 16).U32(bytes.size()).U32(0).U32(0).Append(bytes).Align();
    }
    rest.Append(ids.Append(leaves.bytes()).bytes());
  }
  const size_t size = types.Append(rest.bytes()).bytes().size();

  const size_t optional = 64 + 24;
  const size_t directories = optional + (is64 ? 112 : 96);
  const size_t end = directories + 16 * 8;
  ByteBuilder file;
  file.Append("MZ").PadTo(60).U32(64);
  file.Append("PE").U16(0).U16(is64 ? 0x8664 : 0x14C).U16(1).PadTo(64 + 20);
  file.U16(end - optional).U16(0).U16(is64 ? 0x20B : 0x10B).PadTo(directories - 4).U32(16);
  file.PadTo(directories + 2 * 8).U32(kAddress).U32(size);
  file.PadTo(end).Append(".rsrc").PadTo(end + 8).U32(size).U32(kAddress).U32(size).U32(kPosition);
  return file.PadTo(kPosition).Append(types.bytes()).bytes();
}
inline std::string PortableExecutable(
    bool is64, uint16_t type, uint16_t id,
    const std::vector<std::pair<uint16_t, std::string>>& languages) {
  return PortableExecutable(is64, {{type, id, languages}});
}
