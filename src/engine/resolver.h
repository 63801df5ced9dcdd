// Turns a record's destination into full paths, on this machine and for this run.
//
// A destination is a list of elements, separated by ';'. An element that contains a ':' is an
// absolute directory, taken as it stands. Any other is a macro, or nothing, followed by a subpath,
// or nothing; a macro counts at the very start alone, whatever its case:
//
//   %REMOVE_DIR% %REMOVEDIR%             the Windows directory
//   %INSTALL_DIR% %CURDIR% %CUR_DIR%     the base directory, as for no macro at all
//   %SYS_DIR% %SYSDIR%                   the system directory
//   %PLUGIN_NS_DIR% %PLUGIN_IE_DIR% %PLUGIN_OPERA_DIR%   one browser's plug-in directory
//   %PLUGIN_ALL_DIR%                     fan-out: each browser's that there is
//
// All passes resolve through here, so that they see the same paths. Nothing resolved is ever
// stored, and nothing is normalised.
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

// The code and, through `length`, the length of the macro that the text begins with. A missing text
// gives MacroNone and leaves the length alone.
MacroCode ClassifyMacro(const char* text, size_t* length);

// 1 for a text that is missing, empty or has no ':'; else 0.
int IsRelativeElement(const char* text);
