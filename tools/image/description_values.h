// The values of a description's tables, taken one by one. A value that is not as it should be is a
// fault of its line and key, and then there is none.
#pragma once

#include <toml++/toml.h>

#include <initializer_list>
#include <optional>
#include <string>
#include <string_view>

#include "tools/image/fault_list.h"
#include "tools/image/package_description.h"

namespace image {

int LineOf(const toml::node& node);

class DescriptionValues {
 public:
  explicit DescriptionValues(FaultList* faults) : faults_(*faults) {}

  void Fault(const toml::node& node, const std::string& what) const;
  // Every key of the table but these is a fault.
  void NameUnknownKeys(const toml::table& table,
                       std::initializer_list<std::string_view> known) const;
  // UTF-8, as the file has it.
  std::optional<DescribedText> ReadText(const toml::node& node, std::string_view key) const;
  std::optional<DescribedText> ToAnsi(const DescribedText& utf8, std::string_view key) const;
  // In the code page; none, without a fault, where the table lacks the key.
  std::optional<DescribedText> FindAnsiText(const toml::table& table, std::string_view key) const;

 private:
  FaultList& faults_;
};

}  // namespace image
