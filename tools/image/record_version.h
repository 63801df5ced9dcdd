// The version in a record, as a text and against another one.
#pragma once

#include <string>

#include "package/package_format.h"

namespace image {

// "4.1.7"; a number that is not known is "-".
std::string DescribeVersion(const FileRecord& record);

// As the setup program compares a packaged file with the one that stands in its place: above 0 when
// the packaged one is newer, below 0 when it is older.
int CompareVersions(const FileRecord& packaged, const FileRecord& installed);

}  // namespace image
