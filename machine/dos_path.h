// What a path of the program means before anyone looks at a disk.
#pragma once

#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace machine {

struct DosPath {
  char drive = 'C';                // upper-case letter
  std::vector<std::string> names;  // code page bytes, case as given; empty for the drive's root
  bool endsInSeparator = false;
};

// Takes a path apart: both separators, `.` and `..` (lexically, never above the root), blanks and
// points at its end, one point at the end of a name before. A path without a drive, and one that
// begins with one separator, lie on C:. nullopt for a path that no drive can hold: an empty one, a
// network share, a name with a forbidden character or with a blank or point left at its end, the
// name of a DOS device.
std::optional<DosPath> ParseDosPath(std::string_view text);

// Whether the path names a DOS device, whatever directory stands in front of it.
bool IsDevicePath(std::string_view text);
// Whether that is NUL, which takes and forgets what is written.
bool IsNullDevicePath(std::string_view text);

// Characters of the path written in full, as "C:\a\b".
size_t FullLength(const DosPath& path);

}  // namespace machine
