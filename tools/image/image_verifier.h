// Checks all of an image that the setup program takes on trust.
#pragma once

#include <filesystem>
#include <functional>
#include <string>

namespace image {

struct Finding {
  enum class Kind {
    kGood,   // a part is as it should be
    kWrong,  // the image is not to be used
    kNote,   // it may be meant so
  };
  Kind kind = Kind::kGood;
  std::string part;  // "header", "executable", "regions", or a record by number and name
  std::string text;  // one line, UTF-8; of a good record its sizes, of other good parts ""
};

struct VerifyOrder {
  std::filesystem::path image;
  std::filesystem::path description;   // "": against nothing but itself
  std::filesystem::path sourceFolder;  // of the description's files; "": its own
};

struct PartCount {
  size_t parts = 0;
  size_t wrong = 0;  // parts with a wrong finding
};

// Hands over one finding for each part that is as it should be, one for each thing that is not, and
// notes. With a description everything that `pack` takes from it and from its sources is compared
// too. Throws BadInput when the image can't be read at all, or the description or a source can't.
PartCount VerifyImage(const VerifyOrder& order, const std::function<void(const Finding&)>& tell);

}  // namespace image
