// Turns a record's destination into full paths, on this machine and for this run.
//
// Semicolons divide a destination into elements, a place each. With a ':' in it an element is a
// directory in full, and nothing is made of it. Else it lies below the directory that it begins
// with, by one of these names in whatever case, or below the base directory:
//
//   %REMOVE_DIR% %REMOVEDIR%             the Windows directory
//   %INSTALL_DIR% %CURDIR% %CUR_DIR%     the base directory, as for no macro at all
//   %SYS_DIR% %SYSDIR%                   the system directory
//   %PLUGIN_NS_DIR% %PLUGIN_IE_DIR% %PLUGIN_OPERA_DIR%   one browser's plug-in directory
//   %PLUGIN_ALL_DIR%                     fan-out: each browser's that there is
//
// Install, check and removal ask here, each anew: no path is kept from one run to the next, and
// none is normalised.
#pragma once

#include <cstddef>

#include "core/context.h"
#include "engine/target_list.h"

enum MacroCode {
  MacroNone = 0,
  MacroWindowsDir = 1,
  MacroBaseDir = 4,
  MacroSystemDir = 10,
  MacroNetscape = 11,
  MacroExplorer = 12,
  MacroOpera = 13,
  MacroAllBrowsers = 14,
};

// Fills the list for one record, which is not changed. A missing context, list or record gives
// StatusBadArgument and leaves the list alone; else it is set to empty first, without freeing, and
// the caller frees it afterwards, whatever the result.
//   baseDirectory  may be null when no element stands below it
//   logBrowsers    add an event for each browser that a fan-out finds or misses
// Returns 1, or the soft status of a missing browser when no element behind the one that was
// skipped for it added a target: the list stands and may be empty. A negative result ends the walk
// over the elements at once: StatusBadArgument, StatusNoSystemDir, StatusBufferTooSmall (a path
// above 259 characters), StatusNoMemory. Adds no event for a failure: the caller does.
StatusCode ResolveTargets(SetupContext* context, TargetList* list, const char* baseDirectory,
                          const FileRecord* record, bool logBrowsers);

// Resolves the one element that stands in the record's destination and is no fan-out.
//   directory  may be null; filled only for an element with a subpath, and only when its size is
//              above the length plus 1
// Returns 1 with the path filled; the soft status of a missing browser, without a path; or one of
// the negative results above.
StatusCode ResolveElement(char* path, size_t pathSize, char* directory, size_t directorySize,
                          const char* baseDirectory, const FileRecord* record);

// The code and, through `length`, the length of the macro that the text begins with: MacroNone and
// 0 when it begins with none. For a null text only the code is given.
MacroCode ClassifyMacro(const char* text, size_t* length);

// 0 for a text with a ':' in it, else 1, also for null.
int IsRelativeElement(const char* text);
