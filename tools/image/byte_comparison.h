// Files and packed files byte for byte.
#pragma once

#include "tools/image/image_contents.h"

namespace image {

// Whether two files begin with the same `size` bytes, which both have.
bool HaveEqualBytes(const InputFile& first, const InputFile& second, uint64_t size);

// Whether two streams expand to the same bytes, however they were packed. Throws BadInput for a
// stream that is bad.
bool ExpandToEqualBytes(const InputFile& firstImage, const PackagedFile& first,
                        const InputFile& secondImage, const PackagedFile& second);

}  // namespace image
