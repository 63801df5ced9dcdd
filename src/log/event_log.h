// Turns the events of a run into lines of a text file: English, 8-bit, CR LF.
#pragma once

#include "core/event_list.h"
#include "platform/text.h"

// kNew makes the file anew; kAppend adds at its end, and makes it when it isn't there.
enum class LogMode { kAppend, kNew };

// Room for the standard log's full path: a directory and a name.
inline constexpr size_t kLogPathSize = 2 * kPathSize;

// The log's text for an event code; empty for a code that has none.
const char* EventText(uint32_t code);

// Full path of the standard log, MorivLog.txt in the Windows directory. False when there is none.
bool FindLogPath(char (&path)[kLogPathSize]);

// Writes one block, a heading with the local time and a line for each event, to the file at `path`,
// or to the standard log for a null or empty path. A list that is null or has no events leaves the
// file as it was. A file that can't be made or written costs the log and nothing else: what the
// run had to do has been done.
void WriteEventLog(const EventList* list, const char* path, LogMode mode);

// Appends the block to the report file; does nothing for a null or empty path.
void WriteReportFile(const EventList* list, const char* path);

// The two as every run ends with them: the standard log anew, then the report file.
void WriteLogs(const EventList* list, const char* reportFile);
