// machine.ini: the parser calls back once a key; each key has a row that says how its value is
// taken and, for the error, what form the value must have.
#include "machine/settings.h"

#include <ini.h>

#include <algorithm>
#include <charconv>
#include <chrono>
#include <limits>
#include <sstream>
#include <string_view>

#include "machine/host_file.h"
#include "machine/seam_functions.h"

namespace machine {
namespace {

// Decimal, or hexadecimal behind "0x".
template <typename Number>
bool TakeNumber(std::string_view text, Number* result,
                Number limit = std::numeric_limits<Number>::max()) {
  int base = 10;
  if (text.starts_with("0x") || text.starts_with("0X")) {
    text.remove_prefix(2);
    base = 16;
  }
  Number number = 0;
  const char* const end = text.data() + text.size();
  const auto [stop, error] = std::from_chars(text.data(), end, number, base);
  if (error != std::errc() || stop != end || number < 0 || number > limit) return false;
  *result = number;
  return true;
}

// One of two words.
bool TakeChoice(std::string_view text, std::string_view yes, std::string_view no, bool* result) {
  if (text != yes && text != no) return false;
  *result = text == yes;
  return true;
}

bool TakeDirectory(std::string_view text, std::string* result) {
  const bool isAbsolute = text.size() >= 3 && text.size() < MAX_PATH && text.substr(1, 2) == ":\\";
  if (!isAbsolute) return false;
  *result = text;
  return true;
}

// YYYY-MM-DDTHH:MM:SS
bool TakeTime(std::string_view text, std::optional<SYSTEMTIME>* result) {
  constexpr std::string_view kForm = "0000-00-00T00:00:00";
  if (text.size() != kForm.size()) return false;
  for (size_t i = 0; i < kForm.size(); ++i) {
    const bool fits = kForm[i] == '0' ? text[i] >= '0' && text[i] <= '9' : text[i] == kForm[i];
    if (!fits) return false;
  }
  const auto number = [text](size_t position, size_t length) {
    unsigned value = 0;
    for (const char digit : text.substr(position, length)) {
      value = value * 10 + static_cast<unsigned>(digit - '0');
    }
    return value;
  };
  const std::chrono::year_month_day date{std::chrono::year(static_cast<int>(number(0, 4))),
                                         std::chrono::month(number(5, 2)),
                                         std::chrono::day(number(8, 2))};
  const unsigned hour = number(11, 2), minute = number(14, 2), second = number(17, 2);
  if (!date.ok() || hour > 23 || minute > 59 || second > 59) return false;

  SYSTEMTIME time{};
  time.wYear = static_cast<WORD>(number(0, 4));
  time.wMonth = static_cast<WORD>(number(5, 2));
  time.wDayOfWeek = static_cast<WORD>(std::chrono::weekday(date).c_encoding());
  time.wDay = static_cast<WORD>(number(8, 2));
  time.wHour = static_cast<WORD>(hour);
  time.wMinute = static_cast<WORD>(minute);
  time.wSecond = static_cast<WORD>(second);
  *result = time;
  return true;
}

std::vector<std::string> SplitWords(const std::string& text) {
  std::istringstream stream(text);
  std::vector<std::string> words;
  for (std::string word; stream >> word;) words.push_back(word);
  return words;
}

// NAME N, both required.
bool TakeCall(const std::vector<std::string>& words, Fault* fault) {
  if (words.size() < 2 || !IsSeamFunction(words[0])) return false;
  fault->function = words[0];
  return TakeNumber(words[1], &fault->call) && fault->call >= 1;
}

// NAME N [on] [ERROR]
bool TakeFail(const std::string& text, std::vector<Fault>* faults) {
  const std::vector<std::string> words = SplitWords(text);
  Fault fault;
  if (!TakeCall(words, &fault)) return false;
  size_t next = 2;
  if (next < words.size() && words[next] == "on") {
    fault.fromThenOn = true;
    ++next;
  }
  if (next < words.size() && !TakeNumber(words[next++], &fault.error)) return false;
  if (next != words.size()) return false;
  faults->push_back(fault);
  return true;
}

// NAME N [on], of a function that moves bytes
bool TakeShort(const std::string& text, std::vector<Fault>* faults) {
  const std::vector<std::string> words = SplitWords(text);
  Fault fault;
  fault.isShort = true;
  fault.fromThenOn = words.size() == 3 && words[2] == "on";
  if (!TakeCall(words, &fault) || !MovesBytes(fault.function)) return false;
  if (words.size() != 2 && !fault.fromThenOn) return false;
  faults->push_back(fault);
  return true;
}

// NAME N
bool TakeStop(const std::string& text, std::vector<Fault>* faults) {
  const std::vector<std::string> words = SplitWords(text);
  Fault fault;
  fault.stop = true;
  if (words.size() != 2 || !TakeCall(words, &fault)) return false;
  faults->push_back(fault);
  return true;
}

// `disk` is the letter of the section [disk X], 0 in the others.
using TakeValue = bool (*)(Settings& settings, char disk, const std::string& value);

struct SettingRow {
  std::string_view section;
  std::string_view key;
  std::string_view form;
  TakeValue take;
};

// A path of 259 characters fits, in any encoding.
constexpr int kMaxLine = 2000;

constexpr std::string_view kDirectoryForm = "a path like C:\\windows";
constexpr std::string_view kBytesForm = "a number of bytes";

const SettingRow kSettingRows[] = {
    {"system", "platform", "nt or 9x",
     [](Settings& settings, char, const std::string& value) {
       return TakeChoice(value, "nt", "9x", &settings.ntFamily);
     }},
    {"system", "language", "a language number like 0x0409",
     [](Settings& settings, char, const std::string& value) {
       return TakeNumber(value, &settings.language);
     }},
    {"system", "codepage", "a code page number like 1252",
     [](Settings& settings, char, const std::string& value) {
       return TakeNumber(value, &settings.codePage, 65535);
     }},
    {"system", "windows", kDirectoryForm,
     [](Settings& settings, char, const std::string& value) {
       return TakeDirectory(value, &settings.windowsDirectory);
     }},
    {"system", "system", kDirectoryForm,
     [](Settings& settings, char, const std::string& value) {
       return TakeDirectory(value, &settings.systemDirectory);
     }},
    {"system", "now", "a time like 2001-12-31T23:59:00",
     [](Settings& settings, char, const std::string& value) {
       return TakeTime(value, &settings.now);
     }},
    {"disk", "free", kBytesForm,
     [](Settings& settings, char disk, const std::string& value) {
       return TakeNumber(value, &settings.disks[disk].freeBytes);
     }},
    {"disk", "writable", kBytesForm,
     [](Settings& settings, char disk, const std::string& value) {
       return TakeNumber(value, &settings.disks[disk].writable.emplace());
     }},
    {"disk", "readonly", "0 or 1",
     [](Settings& settings, char disk, const std::string& value) {
       return TakeChoice(value, "1", "0", &settings.disks[disk].readOnly);
     }},
    {"api", "GetDiskFreeSpaceExA", "present or absent",
     [](Settings& settings, char, const std::string& value) {
       return TakeChoice(value, "present", "absent", &settings.hasGetDiskFreeSpaceEx);
     }},
    {"faults", "fail", "FUNCTION N [on] [ERROR]",
     [](Settings& settings, char, const std::string& value) {
       return TakeFail(value, &settings.faults);
     }},
    {"faults", "short", "FUNCTION N [on] of a function that moves bytes",
     [](Settings& settings, char, const std::string& value) {
       return TakeShort(value, &settings.faults);
     }},
    {"faults", "stop", "FUNCTION N",
     [](Settings& settings, char, const std::string& value) {
       return TakeStop(value, &settings.faults);
     }},
};

// "disk c" becomes "disk", and the letter 'C'.
char CutDiskLetter(std::string* section) {
  if (section->size() != 6 || !section->starts_with("disk ")) return 0;
  const char letter = static_cast<char>((*section)[5] & ~0x20);
  if (letter < 'A' || letter > 'Z') return 0;
  section->resize(4);
  return letter;
}

// Returns what is wrong, or "".
std::string ApplySetting(Settings& settings, const std::string& heading, const std::string& key,
                         const std::string& value) {
  std::string section = heading;
  const char disk = CutDiskLetter(&section);
  bool sectionKnown = false;
  for (const SettingRow& row : kSettingRows) {
    if (row.section != section || (row.section == "disk" && disk == 0)) continue;
    sectionKnown = true;
    if (row.key != key) continue;
    if (row.take(settings, disk, value)) return "";
    return "[" + heading + "] " + key + ": \"" + value + "\" is not " + std::string(row.form);
  }
  if (!sectionKnown) return "unknown section [" + heading + "], at key \"" + key + "\"";
  return "unknown key \"" + key + "\" in [" + heading + "]";
}

// The parser goes on to the end of the file; the first mistake is the one told.
struct SettingsParse {
  Settings settings;
  std::string_view rest;  // of the file's text
  int line = 0;           // the line read last
  int mistakeLine = 0;
  std::string mistake;

  void Note(const std::string& what) {
    if (!mistake.empty()) return;
    mistake = what;
    mistakeLine = line;
  }
};

char* ReadIniLine(char* buffer, int size, void* context) {
  auto* parse = static_cast<SettingsParse*>(context);
  ++parse->line;
  if (parse->rest.empty()) return nullptr;
  std::string_view line = parse->rest.substr(0, parse->rest.find('\n'));
  parse->rest.remove_prefix(std::min(line.size() + 1, parse->rest.size()));
  if (line.size() >= static_cast<size_t>(size)) {
    parse->Note("line too long");
    line = {};
  }
  buffer[line.copy(buffer, line.size())] = '\0';
  return buffer;
}

int TakeSetting(void* context, const char* section, const char* key, const char* value) {
  auto* parse = static_cast<SettingsParse*>(context);
  const std::string mistake = ApplySetting(parse->settings, section, key, value);
  if (!mistake.empty()) parse->Note(mistake);
  return 1;
}

}  // namespace

bool ReadSettings(const std::filesystem::path& file, Settings* settings, std::string* error) {
  std::optional<std::string> text;
  if (!ReadOwnFile(file, &text, error)) return false;

  ini_max_line = kMaxLine;
  ini_allow_multiline = false;  // an indented line is a line of its own
  SettingsParse parse;
  if (text) parse.rest = *text;
  const int badLine = ini_parse_stream(ReadIniLine, &parse, TakeSetting, &parse);
  // Positive: the first line that is neither section, key nor comment.
  if (badLine > 0 && (parse.mistake.empty() || badLine < parse.mistakeLine)) {
    parse.mistakeLine = badLine;
    parse.mistake = "neither [SECTION] nor KEY = VALUE";
  }
  if (!parse.mistake.empty()) {
    *error =
        file.filename().string() + ":" + std::to_string(parse.mistakeLine) + ": " + parse.mistake;
    return false;
  }
  *settings = std::move(parse.settings);
  return true;
}

}  // namespace machine
