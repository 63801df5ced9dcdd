// No text from elsewhere reaches a terminal as anything but text.

#include "tools/terminal/printable_text.h"

#include <gtest/gtest.h>

#include "tests/tools/tool_bench.h"
#include "tools/machine/machine_command_line.h"

namespace {

using HostileTexts = SampleBench;

}  // namespace

TEST(PrintableText, EscapesWhatIsMoreThanText) {
  const std::pair<const char*, const char*> rows[] = {
      {"Zeb d\xC3\xA9j\xC3\xA0 \xE4\xB8\x80 \xF0\x9F\x98\x80", nullptr},
      {"a\x1B[2J\n", "a\\u001b[2J\\u000a"},
      {"\x7F\xC2\x85\xC2\x9B", "\\u007f\\u0085\\u009b"},
      {"\xE2\x80\xAE\xE2\x80\x8E\xE2\x81\xA9\xD8\x9C", "\\u202e\\u200e\\u2069\\u061c"},
      {"\xE2\x80\xA8\xE2\x80\xA9\xEF\xBB\xBF", "\\u2028\\u2029\\ufeff"},
      {"\xF3\xA0\x81\x81", "\\udb40\\udc41"},
      // No UTF-8: a lone byte, one too long, a surrogate, above the last, cut short.
      {"\x9B|\xC0\x80|\xED\xA0\x80|\xF4\x90\x80\x80|\xE2\x80",
       "\\x9b|\\xc0\\x80|\\xed\\xa0\\x80|\\xf4\\x90\\x80\\x80|\\xe2\\x80"},
  };
  for (const auto& [text, shown] : rows) {
    const std::string expected = shown == nullptr ? text : shown;
    EXPECT_EQ(terminal::Printable(text), expected);
    EXPECT_EQ(terminal::Printable(expected), expected);
  }
  EXPECT_EQ(terminal::PrintableLines("a\r\nb\n\tc"), "a\\u000d\nb\n\\u0009c");
}

// Every command, on what each can be given: records, folders, a log, a machine.
TEST_F(HostileTexts, AreEscapedByEveryCommand) {
  FileRecord& record = sample.pieces()[1].record;
  SetField(record.fileName, "b\x1B[2J\x9D\x81.dll");
  SetField(record.versionLanguage, "\x1B]0;x\x07");
  Write("hostile.exe", sample.RawBytes());
  Write("log",
        "Installing Moriv : \x1B[31mnow \r\n\r\n"
        "1- Uninstall file is installed correctly :  C:\\\x9D\x1B[2J \r\n");
  std::filesystem::create_directory(Host("\x1B[2J"));
  const std::pair<const char*, int> rows[] = {
      {"list @hostile.exe", 0},
      {"list @hostile.exe --json", 0},
      {"verify @hostile.exe", 1},
      {"verify @hostile.exe --json", 1},
      {"extract @hostile.exe -o @x", 2},
      {"diff @image.exe @hostile.exe", 1},
      {"explain @log", 0},
      {"extract @image.exe -o @\x1B[2J", 0},
      {"list @\x1B[2J", 2},
      {"\x1B[2J", 2},
  };
  const auto expectPrintable = [](const std::string& text) {
    EXPECT_EQ(terminal::PrintableLines(text), text);
    EXPECT_NE(text.find("u001b["), std::string::npos) << text;
  };
  for (const auto& [commandLine, status] : rows) {
    const ToolRun run = Run(commandLine);
    EXPECT_EQ(run.status, status) << commandLine << run.err;
    expectPrintable(run.out + run.err);
  }
  tool = machine_tool::RunMachineTool;
  ASSERT_EQ(Run("new @pc").status, 0);
  Write("pc/drive_c/windows/morivlog.TXT", "\x1B[2J\r\n");
  Write("pc/drive_c/\x1B[2J", "");
  for (const char* commandLine : {"show @pc tree", "show @pc log", "restart @\x1B[2J"}) {
    const ToolRun run = Run(commandLine);
    expectPrintable(run.out + run.err);
  }
}
