// The tree inside a version resource.
//
//   VS_VERSION_INFO                  value: VS_FIXEDFILEINFO
//     StringFileInfo
//       040c04b0                     language and code page
//         FileVersion                value: UTF-16 text
//     VarFileInfo
//       Translation                  value: pairs of language and code page
//
// Every block: u16 length of the whole block, u16 length of its value (in characters for a text,
// else in bytes), u16 1 for a text, else 0; the key as UTF-16 with its NUL; the value; the blocks
// below. Value and blocks begin at multiples of 4 from the start of the resource.
#pragma once

#include <cstddef>
#include <cstdint>
#include <optional>
#include <span>
#include <string>
#include <string_view>

namespace machine {

struct VersionValue {
  size_t offset = 0;    // in the resource, bytes
  size_t size = 0;      // bytes, for a text without its NUL
  bool isText = false;  // UTF-16
};

// Whether the resource is a whole version block.
bool IsVersionBlock(std::span<const uint8_t> resource);

// The value of the block that a path like "\\StringFileInfo\\040c04b0\\FileVersion" names, without
// regard to case; "\\" is the fixed file information. nullopt when there is none, or damage stands
// in the way to it.
std::optional<VersionValue> FindVersionValue(std::span<const uint8_t> resource,
                                             std::string_view path);

// A text value, in the code page.
std::string VersionText(std::span<const uint8_t> resource, const VersionValue& value);

}  // namespace machine
