// From a command line to a request.
#include "core/command_line.h"

#include <gtest/gtest.h>

#include <string>
#include <utility>

namespace {

SetupRequest Parse(const std::string& line) {
  SetupRequest request = {};
  request.language = kLanguageNone;
  (void)ParseCommandLine(line.c_str(), &request);
  return request;
}

TEST(CommandLine, OptionsCombineFromLeftToRight) {
  // "-" separates behind the last "/" alone.
  const std::pair<const char*, uint32_t> rows[] = {
      {"install.txt", 0}, {"/s /r", 9},   {"/R /S", 9},   {"/n", 12},      {"/u /r /s", 11},
      {"/s /i", 4},       {"/i /s", 1},   {"/s /n", 12},  {"/n /s", 9},    {"/s/?", 16},
      {"/h /s", 17},      {"/s /", 1},    {"//s", 1},     {"/s  ", 1},     {"/ s", 0},
      {"/s\t", 0},        {"/silent", 0}, {"\"/s\"", 0},  {"setup /s", 1}, {"-s -r", 9},
      {"-s /i", 4},       {"/s -i", 4},   {"/s -i /r", 8}};
  for (const auto& [line, options] : rows) {
    const SetupRequest request = Parse(line);
    EXPECT_EQ(request.options, options) << line;
    EXPECT_EQ(request.language, kLanguageNone) << line;
  }
  const std::pair<const char*, int32_t> languages[] = {
      {"/FRA /GER", 20000}, {"/eng", 0},        {"/fra", 10000},
      {"/Ita", 30000},      {"/SPA /s", 40000}, {"/FRANCE", kLanguageNone}};
  for (const auto& [line, language] : languages) EXPECT_EQ(Parse(line).language, language) << line;
}

TEST(CommandLine, PathsReachToTheNextMarker) {
  struct Row {
    const char* line;
    const char* installDir;
    const char* reportFile = "";
    uint32_t options = 0;
  };
  const Row rows[] = {
      {"/d:C:\\a /d:", "C:\\a"},
      {"/d:C:\\a /d:C:\\b", "C:\\b"},
      {"/D:C:\\My Files\\a  /s", "C:\\My Files\\a", "", 1},
      {"/d:  C:\\a", "  C:\\a"},
      {"/d: ", ""},  // the blank is cut, and nothing is left behind the prefix
      {"/d:\"C:\\a\"", "\"C:\\a\""},
      {"/d:C:/apps", "C:"},
      {"/d:C:\\my-dir /s", "C:\\my-dir", "", 1},
      {"/RF:a.txt /d:b /rf:", "b", "a.txt"},
      {"/rf", ""},
  };
  for (const Row& row : rows) {
    const SetupRequest request = Parse(row.line);
    EXPECT_STREQ(request.installDir, row.installDir) << row.line;
    EXPECT_STREQ(request.reportFile, row.reportFile) << row.line;
    EXPECT_EQ(request.options, row.options) << row.line;
  }
}

TEST(CommandLine, MissingArgumentsAreRefused) {
  SetupRequest request = {};
  EXPECT_EQ(ParseCommandLine(nullptr, &request), 0);
  EXPECT_EQ(ParseCommandLine("/s", nullptr), 0);
  ApplyOption(nullptr, &request);
  ApplyOption("", &request);
  ApplyOption("s", nullptr);
  EXPECT_EQ(request.options, 0u);
}

}  // namespace
