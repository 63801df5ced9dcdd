// Version data of files. As on Windows these live in version.dll: GetProcAddress hands them out.
//
// The block that GetFileVersionInfoA fills:
//   0  u32  kBlockMark
//   4  u32  size of the resource
//   8       the version resource, as in the file
//           room for its texts in 8 bits: a text at offset N of the resource has its copy at N / 2
// Copies can't meet: a text of n characters takes 2n bytes of the resource and n + 1 of the room,
// and the next one stands behind a header of its own.
#include <algorithm>
#include <cstring>
#include <optional>
#include <span>
#include <string>
#include <vector>

#include "machine/drives.h"
#include "machine/executable_resources.h"
#include "machine/faults.h"
#include "machine/version_block.h"
#include "platform/win32.h"

namespace {

constexpr DWORD kBlockMark = 0x4F464E49;
constexpr DWORD kBlockHeaderSize = 8;

DWORD BlockSize(size_t resourceSize) {
  return static_cast<DWORD>(kBlockHeaderSize + resourceSize + resourceSize / 2 + 1);
}

// A version block tells its length in 16 bits; what a file holds behind it is not kept.
std::optional<std::vector<uint8_t>> ReadVersionOf(LPCSTR name) {
  if (name == nullptr) return std::nullopt;
  const auto file = machine::LocateFile(name);
  if (!file) return std::nullopt;
  auto resource = machine::ReadVersionResource(*file);
  if (resource) resource->resize(std::min<size_t>(resource->size(), 0xFFFF));
  return resource;
}

}  // namespace

extern "C" {

DWORD GetFileVersionInfoSizeA(LPCSTR name, LPDWORD handle) {
  if (machine::CallFails("GetFileVersionInfoSizeA")) return 0;
  if (handle != nullptr) *handle = 0;
  const auto resource = ReadVersionOf(name);
  return resource ? BlockSize(resource->size()) : 0;
}

// Windows cuts the data to a size too small; here such a block stays without any, and its mark is
// taken away so that nothing is found in it.
BOOL GetFileVersionInfoA(LPCSTR name, DWORD, DWORD size, LPVOID data) {
  if (machine::CallFails("GetFileVersionInfoA")) return FALSE;
  if (data == nullptr) return FALSE;
  std::memset(data, 0, size);
  const auto resource = ReadVersionOf(name);
  if (!resource || size < BlockSize(resource->size())) return FALSE;
  const DWORD header[] = {kBlockMark, static_cast<DWORD>(resource->size())};
  static_assert(sizeof(header) == kBlockHeaderSize);
  std::memcpy(data, header, sizeof(header));
  std::memcpy(static_cast<uint8_t*>(data) + kBlockHeaderSize, resource->data(), resource->size());
  return TRUE;
}

// The answer points into the block; a text is copied into the block's own room, for which the
// caller's block is written to, as Windows does.
BOOL VerQueryValueA(LPCVOID data, LPCSTR path, LPVOID* value, PUINT length) {
  if (machine::CallFails("VerQueryValueA")) return FALSE;
  if (length != nullptr) *length = 0;
  if (data == nullptr || path == nullptr || value == nullptr) return FALSE;
  DWORD header[2] = {};
  std::memcpy(header, data, sizeof(header));
  if (header[0] != kBlockMark) return FALSE;

  auto* resource = static_cast<uint8_t*>(const_cast<LPVOID>(data)) + kBlockHeaderSize;
  const std::span<const uint8_t> bytes(resource, header[1]);
  const auto found = machine::FindVersionValue(bytes, path);
  if (!found) return FALSE;
  size_t size = found->size;
  *value = resource + found->offset;
  if (found->isText) {
    // found->offset + found->size <= bytes.size(), so that the copy and its NUL end at
    // bytes.size() / 2 + 1 at the latest: the size of the room.
    const std::string text = machine::VersionText(bytes, *found);
    uint8_t* copy = resource + bytes.size() + found->offset / 2;
    std::memcpy(copy, text.c_str(), text.size() + 1);
    *value = copy;
    size = text.size() + 1;
  }
  if (length != nullptr) *length = static_cast<UINT>(size);
  return TRUE;
}

}  // extern "C"
