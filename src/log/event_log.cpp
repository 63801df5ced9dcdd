#include "log/event_log.h"

#include <ctime>
#include <memory>
#include <new>

#include "package/data_file.h"
#include "package/paths.h"
#include "platform/text.h"
#include "ui/catalog.h"

namespace {

// By event code. A text that ends in " : " is followed by a detail.
constexpr const char* kEventTexts[] = {
    "Moriv Installation application",
    "Found a registered version of Moriv",
    "Found no registered version but the directory of Moriv",
    "Cannot allocate memory",
    "Cannot read next install file information data from Data File : ",
    "Error while constructing destination file path to install file : ",
    "Error opening Data File : ",
    "Error preparing and positionning Data File for reading : ",
    "Error reading Data File : ",
    "Invalide or abscent install data in Data File : ",
    "Cannot initialize Data File",
    "Deleteting file : ",
    "Removing Directory : ",
    "Installation of Moriv succeded",
    "Error installing Uninstall file",
    "Uninstall file is installed correctly : ",
    "Uninstallation of Moriv succeded",
    "Updating the Moriv version on the system",
    "Installing Moriv version on the system",
    "Unistalling Moriv from the system",
    "Cannot unsitall Moriv while depending services still exist on the system : ",
    "Moriv registration removed from the registry",
    "Found Netscape on the system, Moriv Plugin will be installed for this web browser",
    "Cannot find Netscape, Moriv Plugin will not be installed for this web browser",
    "Found Internet Explorer on the system, Moriv Plugin will be installed for this web browser",
    "Cannot find Internet Explorer, Moriv Plugin will not be installed for this web browser",
    "Found Opera on the system, Moriv Plugin will be installed for this web browser",
    "Cannot find Opera, Moriv Plugin will not be installed for this web browser",
    "Cannot create the file path for : ",
    "Cannot create destination file : ",
    "Moriv registered in the system registry",
    "Couldn't register Moriv in the system registry",
    "Have not enough disk space to install Moriv on destination : ",
    "Error copying destination file : ",
    "File copied correctly : ",
    "Found an older version on the system, with at least one older or missing file",
    "Invalid destination directory string : ",
    "Error deleting file before updating it : ",
    "Disk Space Needed : ",
};
constexpr size_t kEventTextCount = sizeof(kEventTexts) / sizeof(kEventTexts[0]);
static_assert(kEventTextCount == EventSpaceNeeded + 1);

constexpr size_t kHeadingSize = 260;
constexpr size_t kLineSize = 780;  // the longest table text and a detail of 519 bytes fit

void WriteText(DataFile* file, const char* text) {
  // Unread: what the log lacks, no run is judged by.
  (void)file->Write(text, static_cast<uint32_t>(strlen(text)));
}

void WriteHeading(DataFile* file) {
  SYSTEMTIME now = {};
  GetLocalTime(&now);
  tm time = {};
  time.tm_year = now.wYear - 1900;
  time.tm_mon = now.wMonth - 1;
  time.tm_mday = now.wDay;
  time.tm_wday = now.wDayOfWeek;
  time.tm_hour = now.wHour;
  time.tm_min = now.wMinute;
  time.tm_sec = now.wSecond;
  // Nobody sets a locale, so the names of days and months are English.
  char heading[kHeadingSize] = {};
  strftime(heading, sizeof(heading),
           "\r\n\r\nInstalling Moriv : %A, %d %B %Y at : %Hh %Mm %Ss \r\n\r\n", &time);
  WriteText(file, heading);
}

void WriteEvent(DataFile* file, int number, const EventEntry& entry) {
  const char* const text = EventText(entry.code);
  char line[kLineSize] = {};
  switch (entry.severity) {
    case SeverityInformation:
      (void)FormatText(line, sizeof(line), "%d- %s %s\r\n", number, text, entry.text);
      break;
    case SeverityWarning:
      (void)FormatText(line, sizeof(line), "%d- %s %s. (Warning)\r\n", number, text, entry.text);
      break;
    default:
      (void)FormatText(line, sizeof(line),
                       "%d- Fatal Error : %s %s. \r\n\r\n (Application will exit)\r\n", number,
                       text, entry.text);
  }
  WriteText(file, line);
}

// The file, open at the place where the block goes.
bool OpenLog(DataFile* file, LogMode mode) {
  if (mode == LogMode::kNew) return file->Create() == 1;
  if (file->OpenForWrite() != 1 && file->Create() != 1) return false;
  return file->SeekToEnd() == 1;
}

}  // namespace

const char* EventText(uint32_t code) {
  return code < kEventTextCount ? kEventTexts[code] : "";
}

bool FindLogPath(char (&path)[kLogPathSize]) {
  char directory[kPathSize] = {};
  char name[kPathSize] = {};
  LoadCatalogText(nullptr, CatalogLogName, name);
  return GetWindowsDir(directory, sizeof(directory)) == 1 &&
         FormatText(path, sizeof(path), "%s\\%s", directory, name);
}

void WriteEventLog(const EventList* list, const char* path, LogMode mode) {
  if (list == nullptr || list->count < 1 || list->entries == nullptr) return;
  char standardPath[kLogPathSize] = {};
  if (IsMissingOrEmpty(path)) {
    if (!FindLogPath(standardPath)) return;
    path = standardPath;
  }
  const std::unique_ptr<DataFile> file(new (std::nothrow) DataFile(path));
  if (file == nullptr || !OpenLog(file.get(), mode)) return;
  WriteHeading(file.get());
  for (int32_t i = 0; i < list->count; ++i) WriteEvent(file.get(), i + 1, list->entries[i]);
}

void WriteReportFile(const EventList* list, const char* path) {
  if (!IsMissingOrEmpty(path)) WriteEventLog(list, path, LogMode::kAppend);
}

void WriteLogs(const EventList* list, const char* reportFile) {
  WriteEventLog(list, nullptr, LogMode::kNew);
  WriteReportFile(list, reportFile);
}
