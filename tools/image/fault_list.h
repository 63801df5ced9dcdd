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

  bool IsEmpty() const { return faults_.empty(); }
  // Throws BadInputs when there is a fault.
  void ThrowIfAny() const;
  std::vector<std::string> Warnings() const;

 private:
  static constexpr int kNoLine = std::numeric_limits<int>::max();

  struct Remark {
    int line;
    std::string text;
  };

  // In the order of their lines the first twenty, the last of which says how many more there are.
  static std::vector<std::string> Told(std::vector<Remark> remarks);

  std::filesystem::path description_;
  std::vector<Remark> faults_;
  std::vector<Remark> warnings_;
};

}  // namespace image
