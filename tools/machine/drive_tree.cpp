#include "tools/machine/drive_tree.h"

#include <algorithm>
#include <cstdint>
#include <cstdio>
#include <vector>

#include "machine/code_page.h"
#include "tools/terminal/printable_text.h"

namespace machine_tool {
namespace {

namespace fs = std::filesystem;

bool ComesBefore(const fs::path& a, const fs::path& b) {
  const auto key = [](const fs::path& path) {
    std::string name = machine::FromUtf8(path.filename().string());
    std::transform(name.begin(), name.end(), name.begin(), [](char c) {
      return static_cast<char>(machine::ToUpperByte(static_cast<unsigned char>(c)));
    });
    return name;
  };
  return key(a) < key(b);
}

std::vector<fs::path> SortedEntries(const fs::path& folder) {
  std::vector<fs::path> entries;
  for (const auto& entry : fs::directory_iterator(folder)) entries.push_back(entry.path());
  std::sort(entries.begin(), entries.end(), ComesBefore);
  return entries;
}

std::string DescribeSize(const fs::directory_entry& entry) {
  if (entry.is_symlink()) return "<LINK>";
  if (entry.is_directory()) return "<DIR>";
  return entry.is_regular_file() ? std::to_string(entry.file_size()) : "<DEVICE>";
}

std::string DescribeEntry(const fs::directory_entry& entry, const std::string& dosPath) {
  const bool isFile = !entry.is_symlink() && entry.is_regular_file();
  const bool isReadOnly =
      isFile && (entry.status().permissions() & fs::perms::owner_write) == fs::perms::none;
  char columns[32];
  std::snprintf(columns, sizeof columns, "%c%c %12s  ", isFile ? 'A' : ' ', isReadOnly ? 'R' : ' ',
                DescribeSize(entry).c_str());
  return columns + terminal::Printable(dosPath) + '\n';
}

void ShowFolder(const fs::path& folder, const std::string& dosPath, std::string* text) {
  for (const fs::path& path : SortedEntries(folder)) {
    const fs::directory_entry entry(path);
    const std::string entryPath = dosPath + path.filename().string();
    *text += DescribeEntry(entry, entryPath);
    if (entry.is_directory() && !entry.is_symlink()) ShowFolder(path, entryPath + '\\', text);
  }
}

}  // namespace

std::string ShowDrives(const fs::path& folder) {
  std::string text;
  for (char letter = 'a'; letter <= 'z'; ++letter) {
    const fs::directory_entry drive(folder / (std::string("drive_") + letter));
    if (!drive.is_directory()) continue;
    const std::string root = std::string(1, static_cast<char>(letter - 'a' + 'A')) + ":\\";
    text += DescribeEntry(drive, root);
    if (!drive.is_symlink()) ShowFolder(drive.path(), root, &text);
  }
  return text;
}

}  // namespace machine_tool
