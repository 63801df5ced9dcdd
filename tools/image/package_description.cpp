#include "tools/image/package_description.h"

#include <algorithm>
#include <string_view>

#include "tools/image/bad_input.h"
#include "tools/image/description_values.h"
#include "tools/image/destination_elements.h"
#include "tools/image/host_text.h"
#include "tools/image/input_file.h"
#include "tools/image/source_finder.h"
#include "tools/image/toml_nesting.h"
#include "tools/terminal/printable_text.h"

namespace image {
namespace {

constexpr uint64_t kLargestDescription = 16u << 20;

class DescriptionReader {
 public:
  DescriptionReader(const std::filesystem::path& file, const std::filesystem::path& sourceFolder,
                    FaultList* faults)
      : faults_(*faults), values_(faults) {
    description_.file = file;
    description_.sourceFolder = sourceFolder.empty() ? file.parent_path() : sourceFolder;
  }

  PackageDescription Read() {
    const toml::table root = Parse();
    values_.NameUnknownKeys(root, {"package", "file", "tree"});
    if (const toml::node* package = root.get("package")) {
      if (package->is_table()) {
        ReadPackage(*package->as_table());
      } else {
        values_.Fault(*package, "\"package\" is to be a table: [package]");
      }
    }
    ReadFiles(root);
    return std::move(description_);
  }

 private:
  toml::table Parse() const {
    const std::vector<uint8_t> bytes = ReadWholeFile(description_.file, kLargestDescription);
    const std::string text(bytes.begin(), bytes.end());
    if (const auto line = FindDeepLine(text)) {
      throw BadInput(description_.file, *line,
                     "is nested too deep: a key of many points, or brackets in brackets; nothing "
                     "in a description goes deeper than " +
                         std::to_string(kDeepestNesting));
    }
    try {
      return toml::parse(text);
    } catch (const toml::parse_error& error) {
      throw BadInput(description_.file, static_cast<int>(error.source().begin.line),
                     std::string(error.description()));
    }
  }

  void ReadPackage(const toml::table& package) {
    values_.NameUnknownKeys(package,
                            {"default_directory", "default_language", "space_needed", "removal"});
    if (const auto directory = values_.FindAnsiText(package, "default_directory")) {
      description_.defaultDirectory = *directory;
    }
    if (const toml::node* language = package.get("default_language")) ReadLanguage(*language);
    if (const toml::node* space = package.get("space_needed")) {
      const auto* number = space->as_integer();
      if (number == nullptr || number->get() < 0 || number->get() > int64_t{UINT32_MAX}) {
        values_.Fault(*space, "\"space_needed\" is to be a number of bytes from 0 to 4294967295");
      } else {
        description_.spaceNeeded = static_cast<uint32_t>(number->get());
      }
    }
    if (const toml::node* removal = package.get("removal")) {
      if (!removal->is_boolean()) values_.Fault(*removal, "\"removal\" is to be true or false");
      description_.isRemoval = removal->value_or(false);
    }
  }

  void ReadLanguage(const toml::node& node) {
    std::optional<int32_t> language;
    if (const auto* name = node.as_string()) language = FindLanguage(name->get());
    if (const auto* offset = node.as_integer())
      language = FindLanguage(std::to_string(offset->get()));
    if (!language) {
      values_.Fault(node, std::string("\"default_language\" is to be ") + kLanguageNames +
                              ", or a language's number");
    }
    description_.defaultLanguage = language.value_or(kNoLanguage);
  }

  // Files and trees in the order in which they stand in the text.
  void ReadFiles(const toml::table& root) {
    std::vector<std::pair<const toml::table*, bool>> tables;  // with whether it is a tree
    for (const char* kind : {"file", "tree"}) {
      const toml::node* node = root.get(kind);
      if (node == nullptr) continue;
      if (!node->is_array_of_tables()) {
        values_.Fault(*node,
                      terminal::Quoted(kind) + " is to be written as tables: [[" + kind + "]]");
        continue;
      }
      for (const toml::node& table : *node->as_array())
        tables.emplace_back(table.as_table(), kind == std::string_view("tree"));
    }
    std::ranges::stable_sort(tables, [](const auto& a, const auto& b) {
      const auto first = a.first->source().begin;
      const auto second = b.first->source().begin;
      return std::pair(first.line, first.column) < std::pair(second.line, second.column);
    });
    if (root.get("file") == nullptr && root.get("tree") == nullptr) {
      faults_.Add(BadInput(description_.file, "has no file in it; add a table [[file]] for each"));
    }
    for (const auto& [table, isTree] : tables) {
      if (isTree) {
        ReadTree(*table);
      } else {
        ReadFile(*table);
      }
      if (description_.files.size() <= kMostFiles) continue;
      faults_.Add(description_.files[kMostFiles].sourceLine,
                  "\"source\": more than 65535 files; leave some out");
      faults_.ThrowIfAny();
    }
  }

  // UTF-8; nullopt, with a fault told, when there is none that is good.
  std::optional<DescribedText> FindSource(const toml::table& table) {
    const toml::node* node = table.get("source");
    if (node == nullptr) {
      values_.Fault(table, "no \"source\" in this table; name a file");
      return std::nullopt;
    }
    std::optional<DescribedText> source = values_.ReadText(*node, "source");
    if (!source) return std::nullopt;
    if (source->text.empty()) {
      values_.Fault(*node, "\"source\" is empty; name a file");
    } else if (source->text.find('\\') != std::string::npos) {
      values_.Fault(*node, "\"source\" " + terminal::Quoted(source->text) +
                               " has a backslash; write / between folders");
    } else {
      return source;
    }
    return std::nullopt;
  }

  // A text, or a list of elements; nullopt, with a fault told, when there is none that is good.
  std::optional<DescribedText> FindDestination(const toml::table& table) {
    const toml::node* node = table.get("destination");
    if (node == nullptr) {
      values_.Fault(table, "no \"destination\" in this table; say where it goes");
      return std::nullopt;
    }
    if (!node->is_array()) return values_.FindAnsiText(table, "destination");
    const toml::array& list = *node->as_array();
    if (list.empty()) values_.Fault(*node, "\"destination\" is an empty list; say where it goes");
    DescribedText joined{"", LineOf(*node)};
    bool isGood = !list.empty();
    for (const toml::node& item : list) {
      const std::optional<DescribedText> utf8 = values_.ReadText(item, "destination");
      const auto element = utf8 ? values_.ToAnsi(*utf8, "destination") : std::nullopt;
      if (element && element->text.find(';') != std::string::npos) {
        values_.Fault(item,
                      "\"destination\" has a ; within an element of its list; write two elements");
      }
      isGood = isGood && element && element->text.find(';') == std::string::npos;
      if (!isGood) continue;
      // The installation directory, as an element at the end, needs a semicolon of its own.
      const bool isLast = &item == &list.back();
      joined.text += element->text + (!isLast || element->text.empty() ? ";" : "");
    }
    if (!isGood) return std::nullopt;
    return joined;
  }

  void ReadFile(const toml::table& table) {
    values_.NameUnknownKeys(table, {"source", "destination", "name", "version", "language"});
    const auto source = FindSource(table);
    const auto destination = FindDestination(table);
    const auto name = values_.FindAnsiText(table, "name");
    FileDescription file;
    file.version = values_.FindAnsiText(table, "version");
    file.language = values_.FindAnsiText(table, "language");
    if (!source || !destination) return;
    file.sourceLine = source->line;
    file.destination = *destination;
    if (!IsPattern(source->text)) {
      if (name) file.name = *name;
      if (name || !table.contains("name")) AddFile(std::move(file), source->text);
      return;
    }
    if (table.contains("name")) {
      values_.Fault(*table.get("name"),
                    "\"name\" can't go with a pattern as the source; leave it out");
      return;
    }
    for (const std::string& found : Find(FindMatches, *source, "matches no file"))
      AddFile(file, found);
  }

  void ReadTree(const toml::table& table) {
    values_.NameUnknownKeys(table, {"source", "destination"});
    auto source = FindSource(table);
    const auto destination = FindDestination(table);
    if (!source || !destination) return;
    while (source->text.ends_with('/') && source->text.size() > 1) source->text.pop_back();
    const size_t prefix = source->text.size() + (source->text.ends_with('/') ? 0 : 1);
    for (const std::string& found : Find(FindTree, *source, "has no file in it")) {
      const size_t end = found.rfind('/');
      FileDescription file;
      file.sourceLine = source->line;
      file.destination = *destination;
      if (end >= prefix && !GoOn(found.substr(prefix, end - prefix), source->line, &file)) continue;
      AddFile(std::move(file), found);
    }
  }

  template <class Finder>
  std::vector<std::string> Find(const Finder& finder, const DescribedText& source,
                                const char* none) {
    std::vector<std::string> found;
    try {
      found = finder(description_.sourceFolder, source.text);
      if (found.empty())
        faults_.Add(source.line, "\"source\" " + terminal::Quoted(source.text) + " " + none);
    } catch (const BadInput& fault) {
      faults_.Add(source.line, std::string("\"source\": ") + fault.what());
    }
    return found;
  }

  // Lets each element of the destination go on with a folder; false, with a fault told, for one
  // that can't stand there.
  bool GoOn(const std::string& folder, int line, FileDescription* file) {
    std::optional<DescribedText> subpath = values_.ToAnsi({folder, line}, "source");
    if (!subpath) return false;
    if (subpath->text.find_first_of(";\\") != std::string::npos) {
      faults_.Add(line, "\"source\" has the folder " + terminal::Quoted(folder) +
                            ", whose ; or \\ means something else in a destination");
      return false;
    }
    std::ranges::replace(subpath->text, '/', '\\');
    std::string destination;
    for (const std::string& element : SplitElements(file->destination.text)) {
      destination += (destination.empty() ? "" : ";") + element;
      destination += (element.ends_with('\\') ? "" : "\\") + subpath->text;
    }
    file->destination.text = std::move(destination);
    return true;
  }

  // Takes the source's own name where the file has none.
  void AddFile(FileDescription file, const std::string& source) {
    file.source = PathOf(source);
    if (file.name.line == 0) {
      const auto name = values_.ToAnsi({TextOf(file.source.filename()), file.sourceLine}, "source");
      if (!name) return;
      file.name = *name;
    }
    description_.files.push_back(std::move(file));
  }

  PackageDescription description_;
  FaultList& faults_;
  const DescriptionValues values_;
};

}  // namespace

PackageDescription ReadDescription(const std::filesystem::path& file,
                                   const std::filesystem::path& sourceFolder, FaultList* faults) {
  return DescriptionReader(file, sourceFolder, faults).Read();
}

PackageDescription ReadDescription(const std::filesystem::path& file,
                                   const std::filesystem::path& sourceFolder) {
  FaultList faults(file);
  PackageDescription description = ReadDescription(file, sourceFolder, &faults);
  faults.ThrowIfAny();
  return description;
}

}  // namespace image
