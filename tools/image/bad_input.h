// What a tool says of input that it can't take: one line, "FILE[:LINE]: what is wrong; what to do".
#pragma once

#include <cerrno>
#include <filesystem>
#include <stdexcept>
#include <string>
#include <system_error>
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

// Of the last call of the C runtime or of host_files.h that failed.
inline std::error_code LastCallError() {
  return {errno, std::generic_category()};
}

// The words of POSIX for it, on every host: those of Windows are in whatever language and code page
// its user has.
inline std::string SystemReason(const std::error_code& error) {
  const std::error_condition condition = error.default_error_condition();
  if (condition.category() == std::generic_category()) return condition.message();
  return "the system's error " + std::to_string(error.value());
}

}  // namespace image
