// What a tool says of input that it can't take: one line, "FILE[:LINE]: what is wrong; what to do".
#pragma once

#include <filesystem>
#include <stdexcept>
#include <string>
#include <utility>
#include <vector>

#include "tools/image/host_text.h"

namespace image {

class BadInput : public std::runtime_error {
 public:
  BadInput(const std::filesystem::path& file, const std::string& what)
      : std::runtime_error(TextOf(file) + ": " + what) {}
  BadInput(const std::filesystem::path& file, int line, const std::string& what)
      : std::runtime_error(TextOf(file) + ":" + std::to_string(line) + ": " + what) {}
};

// Several such lines at once.
class BadInputs : public std::runtime_error {
 public:
  // There is one line at least.
  explicit BadInputs(std::vector<std::string> lines)
      : std::runtime_error(lines.front()), lines_(std::move(lines)) {}
  const std::vector<std::string>& Lines() const { return lines_; }

 private:
  std::vector<std::string> lines_;
};

// The host's words for the last failed system call.
inline std::string SystemReason(int error) {
  return std::generic_category().message(error);
}

}  // namespace image
