#include "machine/dos_path.h"

#include <algorithm>

#include "machine/code_page.h"

namespace machine {
namespace {

constexpr std::string_view kSeparators = "\\/";

bool IsSeparator(char c) {
  return kSeparators.find(c) != std::string_view::npos;
}
bool IsAsciiLetter(char c) {
  return (c >= 'A' && c <= 'Z') || (c >= 'a' && c <= 'z');
}

std::string_view CutEnd(std::string_view name, std::string_view cut) {
  return name.substr(0, name.find_last_not_of(cut) + 1);
}

// CON, PRN, AUX, NUL, COM1 to COM9 and LPT1 to LPT9, whatever the extension.
bool IsDeviceName(std::string_view name) {
  const std::string_view base = CutEnd(name.substr(0, name.find('.')), " ");
  for (const std::string_view device : {"CON", "PRN", "AUX", "NUL"}) {
    if (EqualNoCase(base, device)) return true;
  }
  if (base.size() != 4 || base[3] < '1' || base[3] > '9') return false;
  return EqualNoCase(base.substr(0, 3), "COM") || EqualNoCase(base.substr(0, 3), "LPT");
}

bool IsPossibleName(std::string_view name) {
  static constexpr std::string_view kForbidden = "<>:\"|?*";
  const bool allowed = std::ranges::none_of(name, [](char c) {
    return static_cast<unsigned char>(c) < 0x20 || kForbidden.find(c) != std::string_view::npos;
  });
  return allowed && !IsDeviceName(name);
}

void EnterName(std::string_view part, std::vector<std::string>* names) {
  if (part == "..") {
    if (!names->empty()) names->pop_back();
    return;
  }
  const std::string_view name = CutEnd(part, " .");
  if (!name.empty()) names->emplace_back(name);
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
    EnterName(text.substr(0, length), &path.names);
    text.remove_prefix(std::min(length + 1, text.size()));
  }
  if (!std::ranges::all_of(path.names, IsPossibleName)) return std::nullopt;
  return path;
}

size_t FullLength(const DosPath& path) {
  size_t length = 2;
  for (const std::string& name : path.names) length += 1 + name.size();
  return path.names.empty() ? 3 : length;
}

}  // namespace machine
