#include "tools/image/destination_elements.h"

#include <algorithm>

namespace image {

std::vector<MacroCode> DestinationElement::Macros() const {
  if (macro == MacroAllBrowsers) return {MacroNetscape, MacroExplorer, MacroOpera};
  return {IsInInstallDirectory() ? MacroBaseDir : macro};
}

std::vector<std::string> SplitElements(std::string_view destination) {
  std::vector<std::string> elements;
  while (!destination.empty()) {
    const size_t end = std::min(destination.find(';'), destination.size());
    elements.emplace_back(destination.substr(0, end));
    destination.remove_prefix(std::min(end + 1, destination.size()));
  }
  return elements;
}

DestinationElement ParseElement(const std::string& text) {
  size_t macroLength = 0;
  const MacroCode macro = ClassifyMacro(text.c_str(), &macroLength);
  if (macro != MacroAllBrowsers && !IsRelativeElement(text.c_str())) {
    return {MacroNone, true, "", text};
  }
  const bool hasBackslash = text.substr(macroLength).starts_with('\\');
  return {macro, false, text.substr(0, macroLength),
          text.substr(macroLength + (hasBackslash ? 1 : 0))};
}

}  // namespace image
