// What is wrong with a description and with all that it names, found in one go and told together.
#pragma once

#include <cstddef>
#include <filesystem>
#include <limits>
#include <string>
#include <vector>

#include "tools/image/bad_input.h"

namespace image {

class FaultList {
 public:
  explicit FaultList(const std::filesystem::path& description) : description_(description) {}

  // A fault of the description; `what` names the key.
  void Add(int line, const std::string& what);
  // A fault that no line of the description has; it is told behind the others.
  void Add(const BadInput& fault) { faults_.push_back({kNoLine, fault.what()}); }
  // What is told and taken all the same.
  void Warn(int line, const std::string& what);

  // Throws BadInputs, in the order of the lines, when there is a fault: the first twenty, the last
  // of which says how many more there are.
  void ThrowIfAny() const;
  // In the order of the lines.
  std::vector<std::string> Warnings() const;

 private:
  static constexpr int kNoLine = std::numeric_limits<int>::max();

  struct Remark {
    int line;
    std::string text;
  };

  static std::vector<std::string> InOrder(std::vector<Remark> remarks);

  std::filesystem::path description_;
  std::vector<Remark> faults_;
  std::vector<Remark> warnings_;
};

}  // namespace image
