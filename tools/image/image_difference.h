// What differs between two images, and what that means to a PC that has the older one's files.
#pragma once

#include <filesystem>
#include <nlohmann/json.hpp>
#include <string>
#include <vector>

#include "tools/image/image_contents.h"
#include "tools/image/json_output.h"

namespace image {

struct FieldChange {
  std::string field;
  Json before, after;  // a number or a text
};

// A file of both images: of one name and the same places or, without such, of one name, in turn.
struct FileChange {
  const FileRecord* after = nullptr;
  bool hasOtherBytes = false;
  bool hasOtherPlaces = false;
  int version = 0;  // above 0 when it is newer, below when it is older, as the program compares
  std::vector<FieldChange> fields;
};

// Whether the dialog finds something missing or older on a PC that has all that the older image
// installs; if so, it offers an update.
enum class UpdateOffer {
  kNo,
  kWithBrowser,  // only where there is a browser that the file goes to
  kYes,
};

struct ImageDifference {
  std::vector<FieldChange> header;
  bool hasOtherExecutable = false;
  bool hasOtherOrder = false;       // of the files that both have
  std::vector<FileChange> changed;  // in the newer one's order, as are those added
  std::vector<const FileRecord*> added;
  std::vector<const FileRecord*> removed;
  // Places, in UTF-8, that the older image fills and the newer one doesn't. An update leaves what
  // is there, and the removal program that it writes knows only the newer one's places.
  std::vector<std::string> leftBehind;
  UpdateOffer offer = UpdateOffer::kNo;
  std::string offeredFor;  // the place, in UTF-8, that makes it so; "" for kNo

  bool IsEmpty() const {
    return header.empty() && !hasOtherExecutable && !hasOtherOrder && changed.empty() &&
           added.empty() && removed.empty();
  }
};

// An image with what stands in it. Throws BadInput for a damaged one.
struct OpenImage {
  explicit OpenImage(const std::filesystem::path& path)
      : file(path), contents(ReadWholeContents(file)) {}

  InputFile file;
  ImageContents contents;
};

// The result points into the images. Throws BadInput for a stream that is bad.
ImageDifference CompareImages(const OpenImage& before, const OpenImage& after);

}  // namespace image
