// From a command line to a request.
#include "core/command_line.h"

#include <gtest/gtest.h>

#include <string>

namespace {

SetupRequest Parse(const std::string& line) {
  SetupRequest request = {};
  request.language = kLanguageNone;
  (void)ParseCommandLine(line.c_str(), &request);
  return request;
}

TEST(CommandLine, OptionsCombineFromLeftToRight) {
  struct Row {
    const char* line;
    uint32_t options;
    int32_t language = kLanguageNone;
  };
  const Row rows[] = {
      {"", 0},
      {"install.txt", 0},
      {"/s", 1},
      {"/S", 1},
      {"/s /r", 9},
      {"/r /s", 9},
      {"/i", 4},
      {"/n", 12},
      {"/u", 2},
      {"/u /r /s", 11},
      {"/s /i", 4},
      {"/i /s", 1},
      {"/s /n", 12},
      {"/n /s", 9},
      {"/s /h", 16},
      {"/s/?", 16},
      {"/h /s", 17},
      {"/h /n", 28},
      {"/s /", 1},
      {"/", 0},
      {"//s", 1},
      {"/s  ", 1},
      {"/ s", 0},
      {"/s\t", 0},
      {"/silent", 0},
      {"/XYZ", 0},
      {"\"/s\"", 0},
      {"setup /s", 1},
      {"/FRA /GER", 0, 20000},
      {"/eng", 0, 0},
      {"/fra", 0, 10000},
      {"/Ita", 0, 30000},
      {"/SPA /s", 1, 40000},
      {"/FRA /XYZ", 0, 10000},
      {"/FRANCE", 0},
      // "-" separates behind the last "/" alone.
      {"-s", 1},
      {"-s -r", 9},
      {"-s /i", 4},
      {"/s -i", 4},
      {"/s -i /r", 8},
      {"-", 0},
      {"/s -", 1},
  };
  for (const Row& row : rows) {
    const SetupRequest request = Parse(row.line);
    EXPECT_EQ(request.options, row.options) << row.line;
    EXPECT_EQ(request.language, row.language) << row.line;
  }
}

TEST(CommandLine, PathsReachToTheNextMarker) {
  struct Row {
    const char* line;
    const char* installDir;
    const char* reportFile = "";
    uint32_t options = 0;
  };
  const Row rows[] = {
      {"/d:", ""},
      {"/d:C:\\a /d:", "C:\\a"},
      {"/d:C:\\a /d:C:\\b", "C:\\b"},
      {"/D:C:\\My Files\\a  /s", "C:\\My Files\\a", "", 1},
      {"/d:  C:\\a", "  C:\\a"},
      {"/d: ", ""},  // the blank is cut, and nothing is left behind the prefix
      {"/d:\"C:\\a\"", "\"C:\\a\""},
      {"/d:C:/apps", "C:"},
      {"/d:C:\\my-dir", "C:\\my"},
      {"/d:C:\\my-dir /s", "C:\\my-dir", "", 1},
      {"-d:C:\\a -s", "C:\\a", "", 1},
      {"/rf:C:\\r.txt", "", "C:\\r.txt"},
      {"/RF:a.txt /d:b", "b", "a.txt"},
      {"/rf:", ""},
      {"/rf:a.txt /rf:", "", "a.txt"},
      {"/rf", ""},
  };
  for (const Row& row : rows) {
    const SetupRequest request = Parse(row.line);
    EXPECT_STREQ(request.installDir, row.installDir) << row.line;
    EXPECT_STREQ(request.reportFile, row.reportFile) << row.line;
    EXPECT_EQ(request.options, row.options) << row.line;
  }
}

TEST(CommandLine, AnOptionOf260CharactersHasNoEffect) {
  const std::string longest = "/d:" + std::string(257, 'a');
  EXPECT_EQ(Parse(longest).installDir, std::string(257, 'a'));
  EXPECT_STREQ(Parse(longest + "a").installDir, "");
  // The length is that before trailing blanks are cut.
  EXPECT_STREQ(Parse(longest + " ").installDir, "");
  EXPECT_STREQ(Parse("/d:b /d:" + std::string(300, 'a')).installDir, "b");
  EXPECT_EQ(Parse("/" + std::string(5000, 'a') + "/s").options, OptionSilent);
}

TEST(CommandLine, MissingArgumentsAreRefused) {
  SetupRequest request = {};
  EXPECT_EQ(ParseCommandLine(nullptr, &request), 0);
  EXPECT_EQ(ParseCommandLine("/s", nullptr), 0);
  EXPECT_EQ(ParseCommandLine("no marker", &request), 0);
  EXPECT_EQ(ParseCommandLine("/", &request), 1);
  ApplyOption(nullptr, &request);
  ApplyOption("", &request);
  ApplyOption("s", nullptr);
  EXPECT_EQ(request.options, 0u);
}

}  // namespace
