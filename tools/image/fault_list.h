// What is wrong with a description and with all that it names, found in one go and told together.
#pragma once

#include <cstddef>
#include <filesystem>
#include <string>
#include <vector>

#include "tools/image/bad_input.h"

namespace image {

class FaultList {
 public:
  explicit FaultList(const std::filesystem::path& description) : description_(description) {}

  // A fault of the description; `what` names the key.
  void Add(int line, const std::string& what);
  // A fault of another file, which the description has no line for.
  void Add(const BadInput& fault) { faults_.push_back({0, fault.what()}); }
  // What is told and taken all the same.
  void Warn(int line, const std::string& what);

  // Throws BadInputs, in the order of the lines, when there is a fault: the first twenty, the last
  // of which says how many more there are.
  void ThrowIfAny() const;
  // In the order of the lines.
  std::vector<std::string> Warnings() const;

 private:
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
