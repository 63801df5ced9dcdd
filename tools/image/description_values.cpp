#include "tools/image/description_values.h"

#include <algorithm>

#include "tools/image/record_text.h"
#include "tools/terminal/printable_text.h"

namespace image {

int LineOf(const toml::node& node) {
  return static_cast<int>(node.source().begin.line);
}

void DescriptionValues::Fault(const toml::node& node, const std::string& what) const {
  faults_.Add(LineOf(node), what);
}

void DescriptionValues::NameUnknownKeys(const toml::table& table,
                                        std::initializer_list<std::string_view> known) const {
  for (const auto& [key, node] : table) {
    if (std::find(known.begin(), known.end(), key.str()) != known.end()) continue;
    std::string keys;
    for (const std::string_view name : known)
      keys += (keys.empty() ? "" : ", ") + std::string(name);
    faults_.Add(static_cast<int>(key.source().begin.line),
                "unknown key " + terminal::Quoted(key.str()) + "; known here: " + keys);
  }
}

std::optional<DescribedText> DescriptionValues::ReadText(const toml::node& node,
                                                         std::string_view key) const {
  const auto* text = node.as_string();
  if (text == nullptr) {
    Fault(node, terminal::Quoted(key) + " is to be a text in quotes");
  } else if (text->get().find('\0') != std::string::npos) {
    Fault(node, terminal::Quoted(key) + " has a NUL in it");
  } else {
    return DescribedText{text->get(), LineOf(node)};
  }
  return std::nullopt;
}

std::optional<DescribedText> DescriptionValues::ToAnsi(const DescribedText& utf8,
                                                       std::string_view key) const {
  DescribedText ansi{"", utf8.line};
  if (ConvertToAnsi(utf8.text, &ansi.text)) return ansi;
  faults_.Add(utf8.line, terminal::Quoted(key) + " " + terminal::Quoted(utf8.text) +
                             " has a character outside of code page 1252");
  return std::nullopt;
}

std::optional<DescribedText> DescriptionValues::FindAnsiText(const toml::table& table,
                                                             std::string_view key) const {
  const toml::node* node = table.get(key);
  if (node == nullptr) return std::nullopt;
  const std::optional<DescribedText> text = ReadText(*node, key);
  if (!text) return std::nullopt;
  return ToAnsi(*text, key);
}

}  // namespace image
