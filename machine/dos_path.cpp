#include "machine/dos_path.h"

#include <algorithm>

#include "machine/code_page.h"

namespace machine {
namespace {

constexpr std::string_view kSeparators = "\\/";
constexpr std::string_view kNullDevice = "NUL";

bool IsSeparator(char c) {
  return kSeparators.find(c) != std::string_view::npos;
}
bool IsAsciiLetter(char c) {
  return (c >= 'A' && c <= 'Z') || (c >= 'a' && c <= 'z');
}

std::string_view CutEnd(std::string_view name, std::string_view cut) {
  return name.substr(0, name.find_last_not_of(cut) + 1);
}

// What of a name a device goes by.
std::string_view DeviceBase(std::string_view name) {
  return CutEnd(name.substr(0, name.find_first_of(".:")), " ");
}

// CON, PRN, AUX, NUL, COM1 to COM9 and LPT1 to LPT9, whatever the extension.
bool IsDeviceName(std::string_view name) {
  const std::string_view base = DeviceBase(name);
  for (const std::string_view device : {"CON", "PRN", "AUX"}) {
    if (EqualNoCase(base, device)) return true;
  }
  if (EqualNoCase(base, kNullDevice)) return true;
  if (base.size() != 4 || base[3] < '1' || base[3] > '9') return false;
  return EqualNoCase(base.substr(0, 3), "COM") || EqualNoCase(base.substr(0, 3), "LPT");
}

bool IsPossibleName(std::string_view name) {
  if (name.ends_with(' ') || name.ends_with('.')) return false;
  static constexpr std::string_view kForbidden = "<>:\"|?*";
  const bool allowed = std::ranges::none_of(name, [](char c) {
    return static_cast<unsigned char>(c) < 0x20 || kForbidden.find(c) != std::string_view::npos;
  });
  return allowed && !IsDeviceName(name);
}

// At the end of a path every blank and point falls away, at the end of another name one point.
void EnterName(std::string_view part, bool isLast, std::vector<std::string>* names) {
  if (part == "..") {
    if (!names->empty()) names->pop_back();
    return;
  }
  if (isLast) {
    part = CutEnd(part, " .");
  } else if (part.ends_with('.')) {
    part.remove_suffix(1);
  }
  if (!part.empty()) names->emplace_back(part);
}

// What stands behind the last separator and the drive.
std::string_view LastName(std::string_view path) {
  if (path.size() >= 2 && IsAsciiLetter(path[0]) && path[1] == ':') path.remove_prefix(2);
  return path.substr(path.find_last_of(kSeparators) + 1);
}

}  // namespace

std::optional<DosPath> ParseDosPath(std::string_view text) {
  if (text.empty()) return std::nullopt;
  DosPath path;
  if (text.size() >= 2 && IsAsciiLetter(text[0]) && text[1] == ':') {
    path.drive = static_cast<char>(text[0] & ~0x20);
    text.remove_prefix(2);
  } else if (text.size() >= 2 && IsSeparator(text[0]) && IsSeparator(text[1])) {
    return std::nullopt;
  }

  path.endsInSeparator = !text.empty() && IsSeparator(text.back());
  while (!text.empty()) {
    const size_t length = std::min(text.find_first_of(kSeparators), text.size());
    EnterName(text.substr(0, length), length == text.size(), &path.names);
    text.remove_prefix(std::min(length + 1, text.size()));
  }
  if (!std::ranges::all_of(path.names, IsPossibleName)) return std::nullopt;
  return path;
}

bool IsDevicePath(std::string_view text) {
  if (text.size() >= 2 && IsSeparator(text[0]) && IsSeparator(text[1])) return false;
  return IsDeviceName(LastName(text));
}

bool IsNullDevicePath(std::string_view text) {
  return IsDevicePath(text) && EqualNoCase(DeviceBase(LastName(text)), kNullDevice);
}

size_t FullLength(const DosPath& path) {
  size_t length = 2;
  for (const std::string& name : path.names) length += 1 + name.size();
  return path.names.empty() ? 3 : length;
}

}  // namespace machine
