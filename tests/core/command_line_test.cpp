// From a command line to a request.
#include "core/command_line.h"

#include <gtest/gtest.h>

#include <string>
#include <utility>

namespace {

SetupRequest Parse(const char* line) {
  SetupRequest request = {};
  request.language = kLanguageNone;
  EXPECT_EQ(ParseCommandLine(line, &request), strpbrk(line, "/-") != nullptr ? 1 : 0) << line;
  return request;
}

TEST(CommandLine, BeginsBehindTheProgramsName) {
  const std::pair<const char*, const char*> rows[] = {
      {"\"C:\\My Files\\a.exe\"  /s /r", "/s /r"},
      {"C:\\\xC9\\moriv-s.exe /u", "/u"},  // a letter above 0x7F belongs to the name
      {"a.exe\t \t/s ", "/s "},
      {"\"a.exe\"/s", "/s"},
      {"\"a b", ""},
      {"a\"b c\"/s", "c\"/s"},
      {" /s", "/s"},
      {"a.exe", ""},
      {"", ""},
  };
  for (const auto& [line, rest] : rows) EXPECT_STREQ(SkipProgramName(line), rest) << line;
  EXPECT_EQ(SkipProgramName(nullptr), nullptr);
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
    EXPECT_EQ(Parse(line).options, options) << line;
    EXPECT_EQ(Parse(line).language, kLanguageNone) << line;
  }
  const std::pair<const char*, int32_t> languages[] = {
      {"/FRA /GER", 20000}, {"/eng", 0},        {"/fra", 10000},
      {"/Ita", 30000},      {"/SPA /s", 40000}, {"/FRANCE", kLanguageNone}};
  for (const auto& [line, language] : languages) EXPECT_EQ(Parse(line).language, language) << line;
}

TEST(CommandLine, PathsReachToTheNextMarker) {
  // Options, directory and report file. Of "/d: " nothing is left behind the prefix.
  const std::pair<const char*, const char*> rows[] = {{"/d:C:\\a /d:", "0 C:\\a|"},
                                                      {"/d:C:\\a /d:C:\\b", "0 C:\\b|"},
                                                      {"/D:C:\\A b\\c  /s", "1 C:\\A b\\c|"},
                                                      {"/d:  C:\\a", "0   C:\\a|"},
                                                      {"/d: ", "0 |"},
                                                      {"/d:\"C:\\a\"", "0 \"C:\\a\"|"},
                                                      {"/d:C:/apps", "0 C:|"},
                                                      {"/d:C:\\my-dir /s", "1 C:\\my-dir|"},
                                                      {"/RF:a.txt /d:b /rf:", "0 b|a.txt"},
                                                      {"/rf", "0 |"}};
  for (const auto& [line, told] : rows) {
    const SetupRequest request = Parse(line);
    EXPECT_EQ(std::to_string(request.options) + ' ' + request.installDir + '|' + request.reportFile,
              told);
  }
}

TEST(CommandLine, MissingArgumentsAreRefused) {
  SetupRequest request = {};
  EXPECT_EQ(ParseCommandLine(nullptr, &request) + ParseCommandLine("/s", nullptr), 0);
  ApplyOption(nullptr, &request);
  ApplyOption("", &request);
  ApplyOption("s", nullptr);
  EXPECT_EQ(request.options, 0u);
}

}  // namespace
