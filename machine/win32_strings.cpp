// The string table. A resource of type 6 holds sixteen strings, each a u16 count of UTF-16
// characters and the characters, without a NUL; an absent string has the count 0. Its id is that of
// its strings divided by sixteen, plus one.
#include <algorithm>
#include <cstring>
#include <optional>
#include <string>
#include <vector>

#include "machine/bounded_bytes.h"
#include "machine/code_page.h"
#include "machine/faults.h"
#include "machine/own_resource.h"
#include "platform/win32.h"

namespace {

constexpr int kStringType = 6;
constexpr UINT kStringsPerBlock = 16;

std::u16string FindString(UINT id) {
  const auto resource =
      machine::OwnResource(kStringType, static_cast<int>(id / kStringsPerBlock + 1));
  if (!resource) return {};
  machine::BoundedBytes block(*resource);
  uint64_t offset = 0;
  for (UINT index = 0; index < id % kStringsPerBlock; ++index) {
    offset += 2 + uint64_t{block.U16(offset)} * 2;
  }
  std::u16string text(block.U16(offset), u'\0');
  for (char16_t& unit : text) unit = block.U16(offset += 2);
  return block.good() ? text : std::u16string();
}

}  // namespace

extern "C" {

int LoadStringA(HINSTANCE, UINT id, LPSTR buffer, int size) {
  const bool fails = machine::CallFails("LoadStringA");
  if (buffer == nullptr || size < 0) return 0;
  if (size == 0) return -1;  // as Windows answers where there is no room for a NUL
  const std::string text = fails ? "" : machine::FromUtf16(FindString(id & 0xFFFF));
  const size_t count = std::min(text.size(), static_cast<size_t>(size) - 1);
  std::memcpy(buffer, text.data(), count);
  buffer[count] = '\0';
  return static_cast<int>(count);
}

}  // extern "C"
