#include "tools/image/image_difference.h"

#include <algorithm>
#include <deque>
#include <map>
#include <optional>

#include "tools/image/byte_comparison.h"
#include "tools/image/file_places.h"
#include "tools/image/language_names.h"
#include "tools/image/record_text.h"
#include "tools/image/record_version.h"

namespace image {
namespace {

using Numbers = std::deque<size_t>;  // of records, in their order

// Tells the files of an image apart: by name and places, or by name alone.
std::string NameKey(const FileRecord& record) {
  return ToUpper(FieldText(record.fileName));
}
std::vector<std::string> PlaceKeys(const FileRecord& record) {
  std::vector<std::string> keys;
  for (const FilePlace& place : PlacesOf(record)) keys.push_back(place.key);
  return keys;
}
std::string FullKey(const FileRecord& record) {
  std::vector<std::string> keys = PlaceKeys(record);
  std::ranges::sort(keys);
  std::string key = NameKey(record);
  for (const std::string& place : keys) key += ';' + place;
  return key;
}

class FieldComparison {
 public:
  explicit FieldComparison(std::vector<FieldChange>* changes) : changes_(changes) {}

  void Compare(const char* field, const Json& before, const Json& after) {
    if (before != after) changes_->push_back({field, before, after});
  }
  void CompareText(const char* field, std::span<const char> before, std::span<const char> after) {
    Compare(field, Utf8Text(before), Utf8Text(after));
  }

 private:
  std::vector<FieldChange>* changes_;
};

class ImageComparison {
 public:
  ImageComparison(const OpenImage& before, const OpenImage& after)
      : before_(before), after_(after) {}

  ImageDifference Compare() {
    CompareHeaders();
    PairFiles();
    for (size_t i = 0; i < pairs_.size(); ++i) CompareFile(i);
    CheckOrder();
    FindPlaces();
    return std::move(difference_);
  }

 private:
  const FileRecord& Before(size_t index) const { return before_.contents.files[index].record; }
  const FileRecord& After(size_t index) const { return after_.contents.files[index].record; }
  bool HasStreams() const {
    return before_.contents.header.removalImageFlag != 1 &&
           after_.contents.header.removalImageFlag != 1;
  }

  void CompareHeaders() {
    const PackageHeader& before = before_.contents.header;
    const PackageHeader& after = after_.contents.header;
    FieldComparison fields(&difference_.header);
    fields.Compare("removalImageFlag", before.removalImageFlag, after.removalImageFlag);
    fields.Compare("spaceNeeded", before.spaceNeeded, after.spaceNeeded);
    fields.CompareText("defaultDirectory", before.defaultDirectory, after.defaultDirectory);
    fields.Compare("defaultLanguage", before.defaultLanguage, after.defaultLanguage);
    difference_.hasOtherExecutable = before.dataOffset != after.dataOffset ||
                                     !HaveEqualBytes(before_.file, after_.file, before.dataOffset);
  }

  // Pairs by name and places first, so that of several files of one name each finds its own.
  void PairFiles() {
    pairs_.assign(after_.contents.files.size(), std::nullopt);
    std::vector<bool> isPaired(before_.contents.files.size());
    for (const auto key : {FullKey, NameKey}) {
      std::map<std::string, Numbers> waiting;
      for (size_t i = 0; i < isPaired.size(); ++i) {
        if (!isPaired[i]) waiting[key(Before(i))].push_back(i);
      }
      for (size_t i = 0; i < pairs_.size(); ++i) {
        if (pairs_[i]) continue;
        const auto found = waiting.find(key(After(i)));
        if (found == waiting.end() || found->second.empty()) continue;
        pairs_[i] = found->second.front();
        isPaired[*pairs_[i]] = true;
        found->second.pop_front();
      }
    }
    for (size_t i = 0; i < isPaired.size(); ++i) {
      if (!isPaired[i]) difference_.removed.push_back(&Before(i));
    }
  }

  void CompareFile(size_t index) {
    const FileRecord& after = After(index);
    if (!pairs_[index]) {
      difference_.added.push_back(&after);
      return;
    }
    const FileRecord& before = Before(*pairs_[index]);
    FileChange change;
    change.after = &after;
    change.hasOtherPlaces = PlaceKeys(before) != PlaceKeys(after);
    change.version = CompareVersions(after, before);
    change.hasOtherBytes =
        HasStreams() && !ExpandToEqualBytes(before_.file, before_.contents.files[*pairs_[index]],
                                            after_.file, after_.contents.files[index]);
    FieldComparison fields(&change.fields);
    fields.CompareText("name", before.fileName, after.fileName);
    fields.CompareText("destination", before.destination, after.destination);
    fields.Compare("size", before.fileSize, after.fileSize);
    fields.Compare("version", DescribeVersion(before), DescribeVersion(after));
    fields.CompareText("language", before.versionLanguage, after.versionLanguage);
    if (change.hasOtherBytes || !change.fields.empty()) {
      difference_.changed.push_back(std::move(change));
    }
  }

  void CheckOrder() {
    std::vector<size_t> order;
    for (const std::optional<size_t>& pair : pairs_) {
      if (pair) order.push_back(*pair);
    }
    difference_.hasOtherOrder = !std::ranges::is_sorted(order);
  }

  void FindPlaces() {
    std::map<std::string, const FileRecord*> installed;  // by the key of the place
    for (const PackagedFile& file : before_.contents.files) {
      for (const FilePlace& place : PlacesOf(file.record)) installed[place.key] = &file.record;
    }
    std::map<std::string, const FileRecord*> known;
    for (const PackagedFile& file : after_.contents.files) {
      for (const FilePlace& place : PlacesOf(file.record)) {
        known[place.key] = &file.record;
        const auto found = installed.find(place.key);
        if (found == installed.end() || CompareVersions(file.record, *found->second) > 0) {
          OfferFor(place);
        }
      }
    }
    for (const PackagedFile& file : before_.contents.files) {
      for (const FilePlace& place : PlacesOf(file.record)) {
        if (known.emplace(place.key, &file.record).second) {
          difference_.leftBehind.push_back(place.text);
        }
      }
    }
  }

  void OfferFor(const FilePlace& place) {
    const UpdateOffer offer = place.isCertain ? UpdateOffer::kYes : UpdateOffer::kWithBrowser;
    if (offer <= difference_.offer) return;
    difference_.offer = offer;
    difference_.offeredFor = place.text;
  }

  const OpenImage& before_;
  const OpenImage& after_;
  std::vector<std::optional<size_t>> pairs_;  // of each newer file, the older one's index
  ImageDifference difference_;
};

}  // namespace

ImageDifference CompareImages(const OpenImage& before, const OpenImage& after) {
  return ImageComparison(before, after).Compare();
}

}  // namespace image
