#include "engine/resolver.h"

#include <cstring>

#include "engine/browsers.h"
#include "package/paths.h"
#include "platform/text.h"

namespace {

struct MacroRow {
  const char* text;
  MacroCode code;
};

constexpr MacroRow kMacros[] = {
    {"%REMOVE_DIR%", MacroWindowsDir},
    {"%REMOVEDIR%", MacroWindowsDir},
    {"%INSTALL_DIR%", MacroBaseDir},
    {"%CURDIR%", MacroBaseDir},
    {"%CUR_DIR%", MacroBaseDir},
    {"%SYS_DIR%", MacroSystemDir},
    {"%SYSDIR%", MacroSystemDir},
    {"%PLUGIN_NS_DIR%", MacroNetscape},
    {"%PLUGIN_IE_DIR%", MacroExplorer},
    {"%PLUGIN_OPERA_DIR%", MacroOpera},
    {"%PLUGIN_ALL_DIR%", MacroAllBrowsers},
};

// Room for a path in the making. A browser's directory has at most 267 characters, so that with a
// subpath of 260, a file name of 32 and two backslashes 561 are the most. A system directory of up
// to 519 and a base directory of any length are taken too, and what they make too long is refused.
constexpr size_t kWorkSize = 780;
using WorkText = char[kWorkSize];

// What each directory lookup is told as its size.
constexpr int32_t kLookupSize = 520;

struct Browser {
  MacroCode macro;
  StatusCode missing;
  int (*findPluginDir)(char* buffer, int32_t size);
  EventCode foundEvent;
  EventCode missingEvent;
};

// In the order of a fan-out.
constexpr Browser kBrowsers[] = {
    {MacroNetscape, StatusNoNetscape, FindNetscapePluginDir, EventNetscapeFound,
     EventNetscapeMissing},
    {MacroExplorer, StatusNoExplorer, FindExplorerPluginDir, EventExplorerFound,
     EventExplorerMissing},
    {MacroOpera, StatusNoOpera, FindOperaPluginDir, EventOperaFound, EventOperaMissing},
};

const char* SkipBackslash(const char* text) {
  return *text == '\\' ? text + 1 : text;
}

// The directory that a macro other than a fan-out stands for.
StatusCode FindMacroDirectory(MacroCode code, const char* baseDirectory, WorkText& directory) {
  for (const Browser& browser : kBrowsers) {
    if (browser.macro != code) continue;
    return browser.findPluginDir(directory, kLookupSize) == 1 ? StatusOk : browser.missing;
  }
  switch (code) {
    case MacroWindowsDir:
      return GetWindowsDir(directory, kLookupSize) == 1 ? StatusOk : StatusNoSystemDir;
    case MacroSystemDir: {
      const UINT length = GetSystemDirectoryA(directory, kLookupSize);
      return length > 0 && length < UINT{kLookupSize} ? StatusOk : StatusNoSystemDir;
    }
    default:
      if (baseDirectory == nullptr) return StatusBadArgument;
      return CopyText(directory, baseDirectory) ? StatusOk : StatusBufferTooSmall;
  }
}

// Makes the directory in `work`, a subpath (null for none) and the file name a path, and gives the
// directory with its subpath through `directory`, which stays as it was without a subpath or when
// it is too small.
StatusCode ComposePath(WorkText& work, const char* subpath, const FileRecord& record,
                       char* directory, size_t directorySize) {
  (void)AppendBackslash(work);
  if (subpath != nullptr) {
    if (!AppendText(work, subpath)) return StatusBufferTooSmall;
    if (directory != nullptr && strlen(work) + 1 < directorySize) {
      (void)CopyText(directory, directorySize, work);
    }
    (void)AppendBackslash(work);
  }
  return AppendText(work, TextField(record.fileName).text) ? StatusOk : StatusBufferTooSmall;
}

// Adds a target for each browser that there is. Returns 1 if it added one, else `result`;
// StatusBufferTooSmall or StatusNoMemory at the first target that can't be added.
StatusCode FanOut(SetupContext* context, TargetList* list, const char* behindMacro,
                  const FileRecord& record, bool logBrowsers, StatusCode result) {
  const char* const tail = SkipBackslash(behindMacro);
  const char* const subpath = *tail != '\0' ? tail : nullptr;
  for (const Browser& browser : kBrowsers) {
    WorkText work = {};
    const bool found = browser.findPluginDir(work, kPathSize) == 1;
    if (logBrowsers && found) Inform(&context->events, browser.foundEvent);
    if (logBrowsers && !found) Warn(&context->events, browser.missingEvent);
    if (!found) continue;
    char directory[kPathSize] = {};
    const StatusCode composed = ComposePath(work, subpath, record, directory, sizeof(directory));
    if (composed != StatusOk) return composed;
    if (strlen(work) >= kPathSize) return StatusBufferTooSmall;
    if (AddTarget(list, work, directory) != StatusOk) return StatusNoMemory;
    result = StatusOk;
  }
  return result;
}

StatusCode AddElement(TargetList* list, const char* baseDirectory, const FileRecord& record) {
  char path[kPathSize] = {};
  char directory[kPathSize] = {};
  const StatusCode status =
      ResolveElement(path, sizeof(path), directory, sizeof(directory), baseDirectory, &record);
  if (status != StatusOk) return status;
  return AddTarget(list, path, directory) == StatusOk ? StatusOk : StatusNoMemory;
}

}  // namespace

StatusCode ResolveTargets(SetupContext* context, TargetList* list, const char* baseDirectory,
                          const FileRecord* record, bool logBrowsers) {
  if (context == nullptr || list == nullptr || record == nullptr) return StatusBadArgument;
  *list = {};
  TextField destination(record->destination);
  FileRecord element = *record;
  StatusCode result = StatusOk;
  char* rest = destination.text;
  while (*rest != '\0') {
    char* const text = rest;
    rest += strcspn(rest, ";");
    if (*rest == ';') *rest++ = '\0';

    size_t macroLength = 0;
    if (ClassifyMacro(text, &macroLength) == MacroAllBrowsers) {
      result = FanOut(context, list, text + macroLength, *record, logBrowsers, result);
    } else {
      // Fits: it is a part of a field of the same width. One that fills it has no NUL, and is read
      // as far as the field goes.
      memset(element.destination, 0, sizeof(element.destination));
      memcpy(element.destination, text, strlen(text));
      result = AddElement(list, baseDirectory, element);
    }
    if (result != StatusOk && !IsMissingBrowser(result)) return result;
  }
  return result;
}

StatusCode ResolveElement(char* path, size_t pathSize, char* directory, size_t directorySize,
                          const char* baseDirectory, const FileRecord* record) {
  if (path == nullptr || record == nullptr) return StatusBadArgument;
  const TextField element(record->destination);
  WorkText work = {};
  const char* subpath = nullptr;
  if (IsRelativeElement(element.text) == 0) {
    (void)CopyText(work, element.text);
  } else {
    size_t macroLength = 0;
    const MacroCode code = ClassifyMacro(element.text, &macroLength);
    const StatusCode status = FindMacroDirectory(code, baseDirectory, work);
    if (status != StatusOk) return status;
    const char* const behindMacro = element.text + macroLength;
    if (*behindMacro != '\0') subpath = SkipBackslash(behindMacro);
  }
  const StatusCode status = ComposePath(work, subpath, *record, directory, directorySize);
  if (status != StatusOk) return status;
  return CopyText(path, pathSize, work) ? StatusOk : StatusBufferTooSmall;
}

MacroCode ClassifyMacro(const char* text, size_t* length) {
  if (text == nullptr) return MacroNone;
  for (const MacroRow& row : kMacros) {
    if (!BeginsWithIgnoringCase(text, row.text)) continue;
    if (length != nullptr) *length = strlen(row.text);
    return row.code;
  }
  if (length != nullptr) *length = 0;
  return MacroNone;
}

int IsRelativeElement(const char* text) {
  return text == nullptr || strchr(text, ':') == nullptr ? 1 : 0;
}
