#include "tools/image/fault_list.h"

#include <algorithm>

namespace image {
namespace {

constexpr size_t kMostTold = 20;

}  // namespace

void FaultList::Add(int line, const std::string& what) {
  faults_.push_back({line, BadInput(description_, line, what).what()});
}

void FaultList::Warn(int line, const std::string& what) {
  warnings_.push_back({line, BadInput(description_, line, what).what()});
}

void FaultList::ThrowIfAny() const {
  if (!IsEmpty()) throw BadInputs(Told(faults_));
}

std::vector<std::string> FaultList::Warnings() const {
  return Told(warnings_);
}

std::vector<std::string> FaultList::Told(std::vector<Remark> remarks) {
  std::ranges::stable_sort(remarks, {}, &Remark::line);
  std::vector<std::string> texts;
  for (Remark& remark : remarks) {
    texts.push_back(std::move(remark.text));
    if (texts.size() < kMostTold) continue;
    if (const size_t more = remarks.size() - kMostTold; more > 0)
      texts.back() += " (and " + std::to_string(more) + " more)";
    break;
  }
  return texts;
}

}  // namespace image
