#include "tools/image/fault_list.h"

#include <algorithm>

namespace image {
namespace {

constexpr size_t kMostFaults = 20;

}  // namespace

void FaultList::Add(int line, const std::string& what) {
  faults_.push_back({line, BadInput(description_, line, what).what()});
}

void FaultList::Warn(int line, const std::string& what) {
  warnings_.push_back({line, BadInput(description_, line, what).what()});
}

void FaultList::ThrowIfAny() const {
  if (faults_.empty()) return;
  std::vector<std::string> lines = InOrder(faults_);
  if (lines.size() > kMostFaults) {
    const std::string more = std::to_string(lines.size() - kMostFaults);
    lines.resize(kMostFaults);
    lines.back() += " (and " + more + " more faults)";
  }
  throw BadInputs(std::move(lines));
}

std::vector<std::string> FaultList::Warnings() const {
  return InOrder(warnings_);
}

std::vector<std::string> FaultList::InOrder(std::vector<Remark> remarks) {
  std::ranges::stable_sort(remarks, {}, &Remark::line);
  std::vector<std::string> texts;
  for (Remark& remark : remarks) texts.push_back(std::move(remark.text));
  return texts;
}

}  // namespace image
