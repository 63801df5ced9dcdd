// A destination taken apart. It is a list of elements between semicolons. An element with a colon
// is a directory as it stands; every other one is a macro, or nothing for the installation
// directory, and a subpath.
#pragma once

#include <string>
#include <string_view>
#include <vector>

#include "engine/resolver.h"

namespace image {

struct DestinationElement {
  MacroCode macro = MacroNone;
  bool isFullPath = false;  // the subpath is a directory as it stands
  std::string macroText;    // as written
  std::string subpath;      // without the backslash behind the macro

  bool IsInInstallDirectory() const {
    return !isFullPath && (macro == MacroNone || macro == MacroBaseDir);
  }
  // Whether every machine has the place: it may have no browser for plug-ins.
  bool IsCertain() const {
    return macro != MacroNetscape && macro != MacroExplorer && macro != MacroOpera &&
           macro != MacroAllBrowsers;
  }
  // The macros whose directories it leads to: three for that of all browsers, MacroBaseDir for
  // none.
  std::vector<MacroCode> Macros() const;
};

// Every text up to a semicolon, and what is left behind the last one unless that is nothing.
std::vector<std::string> SplitElements(std::string_view destination);

DestinationElement ParseElement(const std::string& text);

}  // namespace image
