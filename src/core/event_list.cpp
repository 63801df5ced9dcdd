// Each event makes a new array, longer by one: a run has few events.
#include "core/event_list.h"

#include <cstring>
#include <new>

namespace {

void SetEventText(EventEntry* entry, const char* text) {
  const void* const end = memchr(text, '\0', kEventTextSize - 1);
  const size_t length = end != nullptr ? static_cast<size_t>(static_cast<const char*>(end) - text)
                                       : kEventTextSize - 1;
  memcpy(entry->text, text, length);
  entry->text[length] = '\0';
}

}  // namespace

StatusCode InitEventList(EventList* list) {
  if (list == nullptr) return StatusBadPackage;
  list->count = 0;
  list->entries = nullptr;
  return StatusOk;
}

StatusCode AddEvent(EventList* list, uint32_t code, uint32_t severity, const char* text) {
  if (list == nullptr) return StatusBadArgument;
  const int32_t oldCount = list->entries != nullptr && list->count > 0 ? list->count : 0;
  EventEntry* entries = new (std::nothrow) EventEntry[static_cast<size_t>(oldCount) + 1];
  if (entries == nullptr) return StatusNoMemory;

  for (int32_t i = 0; i < oldCount; ++i) {
    entries[i].code = list->entries[i].code;
    entries[i].severity = list->entries[i].severity;
    SetEventText(&entries[i], list->entries[i].text);
  }
  EventEntry* added = &entries[oldCount];
  added->code = code;
  added->severity = severity;
  memset(added->text, 0, sizeof(added->text));
  if (text != nullptr) SetEventText(added, text);

  if (oldCount != 0) delete[] list->entries;
  list->entries = entries;
  list->count = oldCount + 1;
  return StatusOk;
}

void Inform(EventList* list, uint32_t code, const char* text) {
  (void)AddEvent(list, code, SeverityInformation, text);
}

void Warn(EventList* list, uint32_t code, const char* text) {
  (void)AddEvent(list, code, SeverityWarning, text);
}

StatusCode GiveUp(EventList* list, uint32_t code, const char* text, StatusCode status) {
  (void)AddEvent(list, code, SeverityFatal, text);
  return status;
}

StatusCode FreeEventList(EventList* list) {
  if (list == nullptr) return StatusBadArgument;
  if (list->count < 1 || list->entries == nullptr) return StatusOk;
  delete[] list->entries;
  list->entries = nullptr;
  list->count = 0;
  return StatusOk;
}
