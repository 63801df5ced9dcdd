#include "registration/cleanup_script.h"

#include <memory>
#include <new>

#include "package/data_file.h"
#include "package/paths.h"
#include "platform/text.h"
#include "ui/catalog.h"

namespace {

constexpr char kFileName[] = "Moriv.INF";
constexpr char kDeleteSection[] = "RemoveFiles";
constexpr char kWindowsDirNumber[] = "10";  // stands for the Windows directory in an INF file
constexpr size_t kTextSize = 2 * kCatalogTextSize;  // one catalog text and what stands around it

// One write for each format.
template <typename... Texts>
bool WriteFormat(DataFile* file, const char* format, Texts... texts) {
  char text[kTextSize];
#pragma GCC diagnostic push
#pragma GCC diagnostic ignored "-Wformat-nonliteral"
  if (!FormatText(text, sizeof(text), format, texts...)) return false;
#pragma GCC diagnostic pop
  const uint32_t length = static_cast<uint32_t>(strlen(text));
  return file->Write(text, length) == length;
}

// The names of the files that go besides the script.
struct FileNames {
  char program[kCatalogTextSize];
  char log[kCatalogTextSize];
};

bool LoadFileNames(FileNames* names) {
  LoadCatalogText(nullptr, CatalogRemovalProgram, names->program);
  LoadCatalogText(nullptr, CatalogLogName, names->log);
  return names->program[0] != '\0' && names->log[0] != '\0';
}

bool WriteLines(DataFile* file, const FileNames& names) {
  return WriteFormat(file, "[%s]\r\n%s=%s\r\n", "Version", "Signature", "$Chicago$") &&
         WriteFormat(file, "%s=%s\r\n", "AdvancedINF", "2.0") &&
         WriteFormat(file, "\r\n[%s]\r\n%s=%s\r\n", kCleanupSection, "DelFiles", kDeleteSection) &&
         WriteFormat(file, "\r\n[%s]\r\n%s\r\n", kDeleteSection, names.program) &&
         WriteFormat(file, "%s\r\n", names.log) &&  //
         WriteFormat(file, "%s\r\n", kFileName) &&  //
         WriteFormat(file, "\r\n[%s]\r\n%s = %s\r\n", "DestinationDirs", kDeleteSection,
                     kWindowsDirNumber);
}

}  // namespace

int WriteCleanupScript(char* path, size_t size) {
  if (path == nullptr) return 0;
  char target[kPathSize] = {};
  if (GetWindowsDir(target, sizeof(target)) != 1) return 0;
  (void)AppendBackslash(target);
  if (!AppendText(target, kFileName) || !CopyText(path, size, target)) return 0;
  FileNames names = {};
  if (!LoadFileNames(&names)) return 0;  // before a file is made that would stay empty
  (void)DeleteFileChecked(target);       // one of an earlier removal goes; usually there is none
  const std::unique_ptr<DataFile> file(new (std::nothrow) DataFile(target));
  return file != nullptr && file->Create() == 1 && WriteLines(file.get(), names);
}
