// What happened in a run, in the order of the log.
#pragma once

#include <cstddef>
#include <cstdint>

#include "core/status.h"

// Index into the log's table of texts (log/event_log.cpp). Code 0 has a text, and nobody adds it.
enum EventCode : uint32_t {
  EventFoundRegistered = 1,
  EventFoundDirectory = 2,
  EventNoMemory = 3,
  EventBadRecord = 4,
  EventUnresolved = 5,
  EventOpenFailed = 6,
  EventSeekFailed = 7,
  EventReadFailed = 8,
  EventBadPackage = 9,
  EventNoImagePath = 10,
  EventDeletingFile = 11,
  EventRemovingDirectory = 12,
  EventInstallSucceeded = 13,
  EventRemovalProgramFailed = 14,
  EventRemovalProgramWritten = 15,
  EventRemovalSucceeded = 16,
  EventUpdating = 17,
  EventInstalling = 18,
  EventRemoving = 19,
  EventServicesRemain = 20,
  EventUnregistered = 21,
  EventNetscapeFound = 22,
  EventNetscapeMissing = 23,
  EventExplorerFound = 24,
  EventExplorerMissing = 25,
  EventOperaFound = 26,
  EventOperaMissing = 27,
  EventNoDirectory = 28,
  EventExpandFailed = 29,
  EventRegistered = 30,
  EventNotRegistered = 31,
  EventNoDiskSpace = 32,
  EventCopyFailed = 33,
  EventFileCopied = 34,
  EventOlderFound = 35,
  EventBadDirectory = 36,
  EventDeleteFailed = 37,
  EventSpaceNeeded = 38,
};

enum EventSeverity : uint32_t {
  SeverityInformation = 0,
  SeverityWarning = 1,  // the run goes on
  SeverityFatal = 2,    // the sequence gives up here
};

inline constexpr size_t kEventTextSize = 520;

struct EventEntry {
  uint32_t code;
  uint32_t severity;
  char text[kEventTextSize];  // detail, a path or the like; may be empty
};

// A counted array, which the list owns; an empty list has none (null).
struct EventList {
  int32_t count;
  EventEntry* entries;
};

// Empties the list without freeing anything. Returns 1, or StatusBadPackage for a null list.
StatusCode InitEventList(EventList* list);

// Appends one entry. `text` may be null; a text of 520 bytes or more is cut to 519. Returns 1,
// or without a new entry StatusBadArgument for a null list or StatusNoMemory. Nobody looks at
// the result: for want of an event no work is given up.
StatusCode AddEvent(EventList* list, uint32_t code, uint32_t severity, const char* text);

// Add an information, or a warning.
void Inform(EventList* list, uint32_t code, const char* text = nullptr);
void Warn(EventList* list, uint32_t code, const char* text = nullptr);

// Adds the fatal event of an operation that gives up, and returns the status that it gives up with.
StatusCode GiveUp(EventList* list, uint32_t code, const char* text, StatusCode status);

// Frees the entries; the list is empty afterwards. Returns 1, or StatusBadArgument for a null list.
StatusCode FreeEventList(EventList* list);
