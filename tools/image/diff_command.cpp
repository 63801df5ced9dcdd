#include <memory>
#include <nlohmann/json.hpp>
#include <ostream>

#include "tools/image/commands.h"
#include "tools/image/image_difference.h"
#include "tools/image/json_output.h"
#include "tools/image/path_option.h"
#include "tools/image/record_text.h"
#include "tools/image/record_version.h"
#include "tools/terminal/printable_text.h"

namespace image {
namespace {

struct DiffOrder {
  std::filesystem::path before, after;
  bool isJson = false;
};

const char* VersionWord(int version) {
  return version > 0 ? "up" : version < 0 ? "down" : "equal";
}

std::string DescribeValue(const Json& value) {
  return value.is_string() ? terminal::Quoted(value.get<std::string>()) : value.dump();
}

std::string DescribeFields(const std::vector<FieldChange>& fields) {
  std::string text;
  for (const FieldChange& change : fields) {
    text += (text.empty() ? "" : ", ") + change.field + ' ' + DescribeValue(change.before) +
            " -> " + DescribeValue(change.after);
  }
  return text;
}

std::string DescribeChange(const FileChange& change) {
  std::string text = "changed     " + Shown(FieldText(change.after->fileName)) + ": ";
  text += change.hasOtherBytes ? "other bytes" : "same bytes";
  text += std::string(", version ") + VersionWord(change.version);
  if (!change.fields.empty()) text += ", " + DescribeFields(change.fields);
  return text + '\n';
}

std::string DescribeRecord(const FileRecord& record) {
  return Shown(FieldText(record.fileName)) + " " + Shown(FieldText(record.destination)) +
         ", size " + std::to_string(record.fileSize) + ", version " + DescribeVersion(record) +
         '\n';
}

std::string DescribeOffer(const ImageDifference& difference) {
  const std::string place = terminal::Quoted(difference.offeredFor);
  switch (difference.offer) {
    case UpdateOffer::kYes:
      return "update      the dialog offers it, for " + place + '\n';
    case UpdateOffer::kWithBrowser:
      return "update      the dialog offers it where that browser is, for " + place + '\n';
    default:
      return "update      the dialog does not offer it: no file is missing or newer\n";
  }
}

std::string DescribeDifference(const ImageDifference& difference) {
  if (difference.IsEmpty()) return "equal\n";
  std::string text;
  for (const FieldChange& change : difference.header) {
    text += "header      " + DescribeFields({change}) + '\n';
  }
  if (difference.hasOtherExecutable) text += "executable  other bytes\n";
  if (difference.hasOtherOrder) text += "order       the files stand in another one\n";
  for (const FileChange& change : difference.changed) text += DescribeChange(change);
  for (const FileRecord* record : difference.added)
    text += "added       " + DescribeRecord(*record);
  for (const FileRecord* record : difference.removed) {
    text += "removed     " + DescribeRecord(*record);
  }
  for (const std::string& place : difference.leftBehind) {
    text += "left        " + terminal::Quoted(place) +
            " stays after an update, and after a removal too\n";
  }
  return text + DescribeOffer(difference);
}

Json FieldsAsJson(const std::vector<FieldChange>& fields) {
  Json list = Json::array();
  for (const FieldChange& change : fields) {
    list.push_back({{"field", change.field}, {"old", change.before}, {"new", change.after}});
  }
  return list;
}

Json RecordsAsJson(const std::vector<const FileRecord*>& records) {
  Json list = Json::array();
  for (const FileRecord* record : records) {
    list.push_back({{"name", Utf8Text(record->fileName)},
                    {"destination", Utf8Text(record->destination)},
                    {"size", record->fileSize},
                    {"version", DescribeVersion(*record)}});
  }
  return list;
}

Json DifferenceAsJson(const DiffOrder& order, const ImageDifference& difference) {
  Json changed = Json::array();
  for (const FileChange& change : difference.changed) {
    changed.push_back({{"name", Utf8Text(change.after->fileName)},
                       {"hasOtherBytes", change.hasOtherBytes},
                       {"hasOtherPlaces", change.hasOtherPlaces},
                       {"version", VersionWord(change.version)},
                       {"fields", FieldsAsJson(change.fields)}});
  }
  const char* const offers[] = {"no", "with browser", "yes"};
  return {{"old", TextOf(order.before)},
          {"new", TextOf(order.after)},
          {"isEqual", difference.IsEmpty()},
          {"header", FieldsAsJson(difference.header)},
          {"hasOtherExecutable", difference.hasOtherExecutable},
          {"hasOtherOrder", difference.hasOtherOrder},
          {"changed", changed},
          {"added", RecordsAsJson(difference.added)},
          {"removed", RecordsAsJson(difference.removed)},
          {"leftBehind", difference.leftBehind},
          {"updateOffered", offers[static_cast<size_t>(difference.offer)]},
          {"offeredFor", difference.offeredFor}};
}

void Diff(const DiffOrder& order, CommandRun* run) {
  const OpenImage before(order.before);
  const OpenImage after(order.after);
  const ImageDifference difference = CompareImages(before, after);
  if (order.isJson) {
    PrintJson(*run, DifferenceAsJson(order, difference));
  } else {
    run->out << DescribeDifference(difference);
  }
  if (!difference.IsEmpty()) run->status = kFoundDifferent;
}

}  // namespace

void AddDiffCommand(CLI::App* tool, CommandRun* run) {
  CLI::App* command =
      tool->add_subcommand("diff", "Tell what differs in a newer image, and what it leaves behind");
  const auto order = std::make_shared<DiffOrder>();
  AddPathOption(command, "OLD", &order->before, "Older image")->required();
  AddPathOption(command, "NEW", &order->after, "Newer image")->required();
  AddJsonFlag(command, &order->isJson);
  command->callback([order, run] { Diff(*order, run); });
}

}  // namespace image
