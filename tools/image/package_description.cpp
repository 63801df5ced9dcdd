#include "tools/image/package_description.h"

#include <toml++/toml.h>

#include <algorithm>
#include <initializer_list>
#include <string_view>

#include "tools/image/bad_input.h"
#include "tools/image/host_text.h"
#include "tools/image/input_file.h"
#include "tools/image/record_text.h"
#include "tools/image/stream_format.h"

namespace image {
namespace {

constexpr uint64_t kLargestDescription = 16u << 20;

int LineOf(const toml::node& node) {
  return static_cast<int>(node.source().begin.line);
}

class DescriptionReader {
 public:
  explicit DescriptionReader(const std::filesystem::path& file) { description_.file = file; }

  PackageDescription Read() {
    const toml::table root = Parse();
    RefuseUnknownKeys(root, {"package", "file"});
    if (const toml::node* package = root.get("package")) {
      if (!package->is_table()) Fail(LineOf(*package), "\"package\" is to be a table: [package]");
      ReadPackage(*package->as_table());
    }
    ReadFiles(root);
    return std::move(description_);
  }

 private:
  [[noreturn]] void Fail(int line, const std::string& what) const {
    throw BadInput(description_.file, line, what);
  }

  toml::table Parse() const {
    const std::vector<uint8_t> bytes = ReadWholeFile(description_.file, kLargestDescription);
    const std::string text(bytes.begin(), bytes.end());
    try {
      return toml::parse(text);
    } catch (const toml::parse_error& error) {
      Fail(static_cast<int>(error.source().begin.line), std::string(error.description()));
    }
  }

  void RefuseUnknownKeys(const toml::table& table,
                         std::initializer_list<std::string_view> known) const {
    for (const auto& [key, node] : table) {
      if (std::find(known.begin(), known.end(), key.str()) != known.end()) continue;
      std::string keys;
      for (const std::string_view name : known)
        keys += (keys.empty() ? "" : ", ") + std::string(name);
      Fail(static_cast<int>(key.source().begin.line),
           "unknown key \"" + std::string(key.str()) + "\"; known here: " + keys);
    }
  }

  // UTF-8, as the file has it.
  std::optional<DescribedText> FindText(const toml::table& table, const char* key) const {
    const toml::node* node = table.get(key);
    if (node == nullptr) return std::nullopt;
    const auto* text = node->as_string();
    if (text == nullptr)
      Fail(LineOf(*node), std::string("\"") + key + "\" is to be a text in quotes");
    if (text->get().find('\0') != std::string::npos) {
      Fail(LineOf(*node), std::string("\"") + key + "\" has a NUL in it");
    }
    return DescribedText{text->get(), LineOf(*node)};
  }

  DescribedText ToAnsi(const DescribedText& utf8, const char* key) const {
    DescribedText ansi{"", utf8.line};
    if (!ConvertToAnsi(utf8.text, &ansi.text)) {
      Fail(utf8.line, std::string("\"") + key + "\" has a character outside of code page 1252");
    }
    return ansi;
  }

  std::optional<DescribedText> FindAnsiText(const toml::table& table, const char* key) const {
    const std::optional<DescribedText> text = FindText(table, key);
    if (!text) return std::nullopt;
    return ToAnsi(*text, key);
  }

  void ReadPackage(const toml::table& package) {
    RefuseUnknownKeys(package,
                      {"default_directory", "default_language", "space_needed", "removal"});
    if (const auto directory = FindAnsiText(package, "default_directory")) {
      description_.defaultDirectory = *directory;
    }
    if (const toml::node* language = package.get("default_language")) ReadLanguage(*language);
    if (const toml::node* space = package.get("space_needed")) {
      const auto* number = space->as_integer();
      if (number == nullptr || number->get() < 0 || number->get() > int64_t{UINT32_MAX}) {
        Fail(LineOf(*space), "\"space_needed\" is to be a number of bytes from 0 to 4294967295");
      }
      description_.spaceNeeded = static_cast<uint32_t>(number->get());
    }
    if (const toml::node* removal = package.get("removal")) {
      if (!removal->is_boolean()) Fail(LineOf(*removal), "\"removal\" is to be true or false");
      description_.isRemoval = removal->as_boolean()->get();
    }
  }

  void ReadLanguage(const toml::node& node) {
    std::optional<int32_t> language;
    if (const auto* name = node.as_string()) language = FindLanguage(name->get());
    if (const auto* offset = node.as_integer())
      language = FindLanguage(std::to_string(offset->get()));
    if (!language) {
      Fail(LineOf(node), std::string("\"default_language\" is to be ") + kLanguageNames +
                             ", or a language's number");
    }
    description_.defaultLanguage = *language;
  }

  void ReadFiles(const toml::table& root) {
    const toml::node* files = root.get("file");
    if (files == nullptr) {
      throw BadInput(description_.file, "has no file in it; add a table [[file]] for each");
    }
    if (!files->is_array_of_tables()) {
      Fail(LineOf(*files), "\"file\" is to be written as tables: [[file]]");
    }
    for (const toml::node& file : *files->as_array()) ReadFile(*file.as_table());
  }

  void ReadFile(const toml::table& table) {
    RefuseUnknownKeys(table, {"source", "destination", "name", "version", "language"});
    FileDescription file;
    const auto source = FindText(table, "source");
    if (!source || source->text.empty())
      Fail(LineOf(table), "this file has no \"source\"; name one");
    file.source = PathOf(source->text);
    file.sourceLine = source->line;
    const auto destination = FindAnsiText(table, "destination");
    if (!destination) Fail(LineOf(table), "this file has no \"destination\"; say where it goes");
    file.destination = *destination;
    const auto name = FindAnsiText(table, "name");
    file.name = name ? *name : ToAnsi({TextOf(file.source.filename()), source->line}, "source");
    file.version = FindAnsiText(table, "version");
    file.language = FindAnsiText(table, "language");
    description_.files.push_back(std::move(file));
  }

  PackageDescription description_;
};

}  // namespace

PackageDescription ReadDescription(const std::filesystem::path& file) {
  return DescriptionReader(file).Read();
}

}  // namespace image
