// Places that a package may have, and that its author had better not give it.
#pragma once

#include <cstddef>
#include <string>
#include <string_view>
#include <vector>

namespace image {

struct PlaceWarning {
  size_t file = 0;   // index of the file whose destination it is about
  std::string text;  // UTF-8, what the destination does and the mend: goes behind the destination
};

// What there is to say of the destinations of a package, in package order, all without a fault:
//   - a directory in full that a macro leads to on most PCs, but not on all;
//   - a directory that an install makes and the removal leaves. A removal deletes the files in
//     package order, and behind each the last directory of its subpath if that is empty by then: it
//     looks at none above it, and at no directory in full.
// All texts are code page bytes.
//   defaultDirectory  the header's; "" for the setup program's own
std::vector<PlaceWarning> FindPlaceWarnings(const std::vector<std::string>& destinations,
                                            std::string_view defaultDirectory);

}  // namespace image
