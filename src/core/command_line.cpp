#include "core/command_line.h"

#include <cstring>

namespace {

const char* FindMarker(const char* text) {
  const char* slash = strchr(text, '/');
  return slash != nullptr ? slash : strchr(text, '-');
}

struct OptionRow {
  const char* text;
  uint32_t clear;
  uint32_t set;
};

constexpr uint32_t kEveryBit = 0xFFFFFFFF;
constexpr OptionRow kOptions[] = {
    {"s", OptionInteractive, OptionSilent},
    {"i", OptionSilent, OptionInteractive},
    {"u", 0, OptionRemove},
    {"r", 0, OptionRegister},
    {"n", OptionSilent, OptionInteractive | OptionRegister},
    {"h", kEveryBit, OptionHelp},
    {"?", kEveryBit, OptionHelp},
};

struct LanguageRow {
  const char* text;
  int32_t language;
};

constexpr LanguageRow kLanguages[] = {
    {"ENG", kLanguageEnglish}, {"FRA", kLanguageFrench},  {"GER", kLanguageGerman},
    {"ITA", kLanguageItalian}, {"SPA", kLanguageSpanish},
};

// Copies what stands behind the prefix, if anything does. True when the text has the prefix.
bool TakePath(const char* text, const char* prefix, char (&path)[kPathSize]) {
  if (!BeginsWithIgnoringCase(text, prefix)) return false;
  const char* value = text + strlen(prefix);
  if (*value != '\0') (void)CopyText(path, value);  // an option text is shorter than a path
  return true;
}

}  // namespace

const char* SkipProgramName(const char* commandLine) {
  if (commandLine == nullptr) return nullptr;
  const bool isQuoted = *commandLine == '"';
  const char* rest = isQuoted ? commandLine + 1 : commandLine;
  rest += strcspn(rest, isQuoted ? "\"" : " \t");
  if (isQuoted && *rest == '"') ++rest;
  return rest + strspn(rest, " \t");
}

void ApplyOption(const char* text, SetupRequest* request) {
  if (IsMissingOrEmpty(text) || request == nullptr) return;
  for (const OptionRow& row : kOptions) {
    if (!EqualIgnoringCase(text, row.text)) continue;
    request->options = (request->options & ~row.clear) | row.set;
    return;
  }
  if (TakePath(text, "d:", request->installDir)) return;
  for (const LanguageRow& row : kLanguages) {
    if (!EqualIgnoringCase(text, row.text)) continue;
    request->language = row.language;
    return;
  }
  // The last test: what matches nothing is dropped.
  (void)TakePath(text, "rf:", request->reportFile);
}

int ParseCommandLine(const char* line, SetupRequest* request) {
  if (line == nullptr || request == nullptr) return 0;
  const char* marker = FindMarker(line);
  if (marker == nullptr) return 0;
  while (marker != nullptr) {
    const char* start = marker + 1;
    if (*start == '\0') break;
    marker = FindMarker(start);
    const size_t length = marker != nullptr ? static_cast<size_t>(marker - start) : strlen(start);
    char option[kPathSize] = {};
    if (length >= sizeof(option)) continue;
    memcpy(option, start, length);
    CutTrailingBlanks(option);
    ApplyOption(option, request);
  }
  return 1;
}
