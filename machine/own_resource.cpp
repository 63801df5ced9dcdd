#include "machine/own_resource.h"

#include <span>

#include "machine/resource_file.h"

// The .res bytes that the native program embeds. Weak: a program without resources links too.
extern "C" {
extern const uint8_t moriv_resources_begin[] __attribute__((weak));
extern const uint8_t moriv_resources_end[] __attribute__((weak));
}

namespace machine {

std::optional<std::vector<uint8_t>> OwnResource(int type, int id) {
  const uint8_t* begin = moriv_resources_begin;
  const uint8_t* end = moriv_resources_end;
  if (begin == nullptr || end == nullptr) return std::nullopt;
  const auto data = FindInResourceFile({begin, static_cast<size_t>(end - begin)}, type, id);
  if (!data) return std::nullopt;
  return std::vector<uint8_t>(data->begin(), data->end());
}

}  // namespace machine
