#include "machine/registry_text.h"

#include <algorithm>
#include <array>
#include <cctype>
#include <charconv>
#include <limits>
#include <optional>

#include "machine/code_page.h"

namespace machine {
namespace {

constexpr std::string_view kHeading = "REGEDIT4";
constexpr std::string_view kLocalMachine = "HKEY_LOCAL_MACHINE";
constexpr std::string_view kClassesRoot = "HKEY_CLASSES_ROOT";
constexpr std::string_view kCurrentUser = "HKEY_CURRENT_USER";
constexpr std::string_view kBlanks = " \t";
constexpr DWORD kRegBinary = 3;
constexpr DWORD kRegDword = 4;

bool IsControl(char byte) {
  return static_cast<unsigned char>(byte) < 0x20;
}

// ---- Writing

std::string Quote(std::string_view text) {
  std::string quoted = "\"";
  for (const char byte : text) {
    if (byte == '\\' || byte == '"') quoted += '\\';
    quoted += byte;
  }
  return quoted + '"';
}

bool IsPlainText(const RegistryValue& value) {
  return value.type == REG_SZ && !value.data.empty() && value.data.back() == 0 &&
         std::none_of(value.data.begin(), value.data.end() - 1,
                      [](uint8_t byte) { return IsControl(static_cast<char>(byte)); });
}

std::string FormatData(const RegistryValue& value) {
  if (IsPlainText(value)) return Quote(std::string(value.data.begin(), value.data.end() - 1));
  char prefix[24];
  std::snprintf(prefix, sizeof(prefix), "hex(%x):", value.type);
  std::string text = prefix;
  for (size_t at = 0; at < value.data.size(); ++at) {
    char digits[8];
    std::snprintf(digits, sizeof(digits), at == 0 ? "%02x" : ",%02x", value.data[at]);
    text += digits;
  }
  return text;
}

void WriteKey(const RegistryKey& key, const std::string& path, std::string* text) {
  *text += "\n[" + path + "]\n";
  for (const RegistryValue& value : key.values) {
    *text += (value.name.empty() ? "@" : Quote(value.name)) + '=' + FormatData(value) + '\n';
  }
  for (const auto& subkey : key.subkeys) WriteKey(*subkey, path + '\\' + subkey->name, text);
}

// A root has a section only when it holds values: it is there in any case.
void WriteRoot(const RegistryKey& root, std::string_view name, std::string* text) {
  const std::string path(name);
  if (!root.values.empty()) return WriteKey(root, path, text);
  for (const auto& subkey : root.subkeys) WriteKey(*subkey, path + '\\' + subkey->name, text);
}

// ---- Reading

std::string_view TrimEnd(std::string_view text) {
  const size_t last = text.find_last_not_of(kBlanks);
  return text.substr(0, last == std::string_view::npos ? 0 : last + 1);
}

std::string_view TrimStart(std::string_view text) {
  return text.substr(std::min(text.find_first_not_of(kBlanks), text.size()));
}

bool TakePrefix(std::string_view prefix, std::string_view* text) {
  if (!EqualNoCase(text->substr(0, prefix.size()), prefix)) return false;
  text->remove_prefix(prefix.size());
  return true;
}

// Takes hexadecimal digits off the front, `maxDigits` at most and at least one.
std::optional<uint32_t> TakeHexNumber(size_t maxDigits, std::string_view* text) {
  const std::string_view digits = text->substr(0, maxDigits);
  uint32_t number = 0;
  const auto end = std::from_chars(digits.data(), digits.data() + digits.size(), number, 16);
  if (end.ec != std::errc() || end.ptr == digits.data()) return std::nullopt;
  text->remove_prefix(static_cast<size_t>(end.ptr - digits.data()));
  return number;
}

// Takes a quoted text off the front; only \\ and \" are escapes.
std::optional<std::string> TakeQuoted(std::string_view* text) {
  if (!TakePrefix("\"", text)) return std::nullopt;
  std::string plain;
  for (size_t at = 0; at < text->size(); ++at) {
    char byte = (*text)[at];
    if (byte == '"') {
      text->remove_prefix(at + 1);
      return plain;
    }
    if (byte == '\\') {
      if (++at == text->size()) return std::nullopt;
      byte = (*text)[at];
      if (byte != '\\' && byte != '"') return std::nullopt;
    }
    plain += byte;
  }
  return std::nullopt;
}

class RegistryReader {
 public:
  RegistryReader(std::string_view text, const RegistryRoots& roots) : rest_(text), roots_(roots) {}

  bool Read(std::string* error) {
    const bool good = ReadLines();
    if (!good) *error = std::to_string(lineNumber_) + ": " + problem_;
    return good;
  }

 private:
  bool ReadLines() {
    std::string_view line;
    if (!NextLine(&line) || TrimEnd(line) != kHeading) {
      lineNumber_ = 1;
      return Fail("the file does not begin with REGEDIT4");
    }
    while (NextLine(&line)) {
      line = TrimStart(TrimEnd(line));
      if (line.empty() || line.front() == ';') continue;
      if (line.front() == '[' ? !ReadSection(line) : !ReadValue(line)) return false;
    }
    return true;
  }

  bool NextLine(std::string_view* line) {
    if (rest_.empty()) return false;
    ++lineNumber_;
    const size_t end = rest_.find('\n');
    *line = rest_.substr(0, end);
    rest_.remove_prefix(end == std::string_view::npos ? rest_.size() : end + 1);
    if (line->ends_with('\r')) line->remove_suffix(1);
    return true;
  }

  bool ReadSection(std::string_view line) {
    if (!line.ends_with(']')) return Fail("a section without its closing bracket");
    const std::string_view path = line.substr(1, line.size() - 2);
    const size_t rootEnd = std::min(path.find('\\'), path.size());
    const std::string_view root = path.substr(0, rootEnd);
    std::string below(path.substr(rootEnd));
    below.erase(0, 1);

    std::shared_ptr<RegistryKey> start = roots_.localMachine;
    if (EqualNoCase(root, kClassesRoot)) {
      below = kClassesPath + ("\\" + below);
    } else if (EqualNoCase(root, kCurrentUser)) {
      start = roots_.currentUser;
    } else if (!EqualNoCase(root, kLocalMachine)) {
      return Fail("an unknown root key: " + std::string(root));
    }
    key_ = MakeKey(start, below);
    return key_ != nullptr || Fail("a bad key name: " + std::string(path));
  }

  bool ReadValue(std::string_view line) {
    if (key_ == nullptr) return Fail("a value in front of the first key");
    RegistryValue value;
    if (!TakePrefix("@", &line)) {
      const std::optional<std::string> name = TakeQuoted(&line);
      if (!name) return Fail("neither a section nor a value");
      if (!IsValueName(*name)) return Fail("a bad value name");
      value.name = *name;
    }
    line = TrimStart(line);
    if (!TakePrefix("=", &line)) return Fail("a value without its equals sign");
    if (!ReadData(TrimStart(line), &value)) return false;
    if (RegistryValue* old = FindValue(*key_, value.name)) {
      *old = std::move(value);
    } else {
      key_->values.push_back(std::move(value));
    }
    return true;
  }

  bool ReadData(std::string_view text, RegistryValue* value) {
    if (text.starts_with('"')) return ReadText(text, value);
    if (TakePrefix("dword:", &text)) return ReadDword(text, value);
    if (TakePrefix("hex:", &text)) {
      value->type = kRegBinary;
      return ReadHex(text, value);
    }
    if (TakePrefix("hex(", &text)) {
      const std::optional<uint32_t> type = TakeHexNumber(8, &text);
      if (!type || !TakePrefix("):", &text)) return Fail("a bad value type");
      value->type = *type;
      return ReadHex(text, value);
    }
    return Fail("data of an unknown form");
  }

  bool ReadText(std::string_view text, RegistryValue* value) {
    const std::optional<std::string> plain = TakeQuoted(&text);
    if (!plain || !text.empty()) return Fail("a text that is not well quoted");
    value->type = REG_SZ;
    value->data.assign(plain->begin(), plain->end());
    value->data.push_back(0);
    return true;
  }

  bool ReadDword(std::string_view text, RegistryValue* value) {
    const std::optional<uint32_t> number = TakeHexNumber(8, &text);
    if (!number || !text.empty()) return Fail("a bad dword");
    value->type = kRegDword;
    for (int shift = 0; shift < 32; shift += 8) {
      value->data.push_back(static_cast<uint8_t>(*number >> shift));
    }
    return true;
  }

  // Bytes between commas. A backslash at the end of a line goes on in the next one.
  bool ReadHex(std::string_view text, RegistryValue* value) {
    bool wantsByte = false;  // behind a comma
    for (;;) {
      text = TrimStart(text);
      if (text == "\\") {
        if (!NextLine(&text)) return Fail("the file ends within a value");
        text = TrimEnd(text);
        continue;
      }
      if (text.empty()) return !wantsByte || Fail("a comma without a byte behind it");
      const std::optional<uint32_t> byte = TakeHexNumber(2, &text);
      if (!byte) return Fail("a bad hexadecimal byte");
      value->data.push_back(static_cast<uint8_t>(*byte));
      text = TrimStart(text);
      wantsByte = TakePrefix(",", &text);
      if (!wantsByte && !text.empty()) return Fail("a bad hexadecimal byte");
    }
  }

  bool Fail(std::string problem) {
    problem_ = std::move(problem);
    return false;
  }

  std::string_view rest_;
  const RegistryRoots& roots_;
  std::shared_ptr<RegistryKey> key_;
  int lineNumber_ = 0;
  std::string problem_;
};

}  // namespace

bool ReadRegistryText(std::string_view text, const RegistryRoots& roots, std::string* error) {
  return RegistryReader(text, roots).Read(error);
}

std::string WriteRegistryText(const RegistryRoots& roots) {
  std::string text = std::string(kHeading) + '\n';
  WriteRoot(*roots.localMachine, kLocalMachine, &text);
  WriteRoot(*roots.currentUser, kCurrentUser, &text);
  return text;
}

}  // namespace machine
