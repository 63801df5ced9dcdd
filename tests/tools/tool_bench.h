// A folder of its own for each test of a tool, with what a package is made of.
#pragma once

#include <gtest/gtest.h>

#include <algorithm>
#include <sstream>
#include <string>
#include <vector>

#include "tests/support/test_image.h"
#include "tools/image/image_command_line.h"

// What a tool said and how it ended.
struct ToolRun {
  int status = -1;
  std::string out, err;
};

class ToolBench : public testing::Test, public TemporaryFolder {
 public:
  void TestBody() override {}  // so that a fuzz target can have a bench too

  // Names of all that stands in a folder, sorted.
  std::vector<std::string> NamesIn(const std::string& folder) const {
    std::vector<std::string> names;
    for (const auto& entry : std::filesystem::directory_iterator(Host(folder)))
      names.push_back(entry.path().filename().string());
    std::ranges::sort(names);
    return names;
  }

  // Runs the tool; its arguments stand between blanks, and "@name" is a path in the test's folder.
  // A run that is refused says why, each line beginning with the tool, and leaves the folder as it
  // was; one that isn't says nothing but warnings.
  ToolRun Run(const std::string& commandLine) const {
    std::vector<std::string> arguments = {"tool"};
    std::istringstream words(commandLine);
    for (std::string word; words >> word;)
      arguments.push_back(word[0] == '@' ? Host(word.substr(1)).string() : word);
    std::vector<const char*> argv;
    for (const std::string& argument : arguments) argv.push_back(argument.c_str());
    const std::vector<std::string> before = NamesIn(".");
    std::ostringstream out, err;
    const int status = tool(static_cast<int>(argv.size()), argv.data(), out, err);
    const std::string said = err.str();
    EXPECT_TRUE(status == 0 || status == 1 || status == 2) << status;
    std::istringstream lines(said);
    for (std::string line; std::getline(lines, line);)
      EXPECT_TRUE(line.starts_with(status == 2 ? "moriv-" : "moriv-image: warning: ")) << said;
    EXPECT_TRUE(status != 2 || said.ends_with('\n')) << "nothing is said";
    EXPECT_TRUE(status != 2 || NamesIn(".") == before) << said;
    return {status, out.str(), said};
  }

  // It was refused, and this is a part of what it said.
  static void ExpectRefused(const ToolRun& run, const std::string& said = "") {
    EXPECT_EQ(run.status, 2) << said;
    EXPECT_NE(run.err.find(said), std::string::npos) << said << ": " << run.err;
  }

  decltype(&image::RunImageTool) tool = image::RunImageTool;
};

// Holds stub.exe, a.exe (45056 bytes, version 4.1.7), b.dll (3000 bytes, random), empty.txt and
// setup.toml, and all of it packed as image.exe.
class SampleBench : public ToolBench {
 public:
  static constexpr char kDescription[] = R"([package]
default_directory = 'C:\Program Files\Moriv'
default_language = "french"

[[file]]
source = "a.exe"
destination = '%INSTALL_DIR%'

[[file]]
source = "b.dll"
destination = '%SYS_DIR%\moriv;%PLUGIN_ALL_DIR%'
version = "1.2.3"
language = "040904b0"

[[file]]
source = "empty.txt"
destination = '%INSTALL_DIR%\docs'
name = "readme.txt"
)";

  SampleBench() {
    Write("stub.exe", SetupStub());
    std::string program = VersionedProgram("4.1.7");
    program.resize(45056);
    Write("a.exe", program);
    Write("b.dll", RandomBytes(3000, 1));
    Write("empty.txt", "");
    Write("setup.toml", kDescription);
    const ToolRun run = Pack("@setup.toml", "@stub.exe", "@image.exe");
    EXPECT_EQ(run.status, 0) << run.err;
    sample = ImageBuilder::TakenApart(Read("image.exe"));
  }

  // Packs a description, which is a text or the "@name" of a file.
  ToolRun Pack(const std::string& description, const std::string& stub = "@stub.exe",
               const std::string& output = "@new.exe") const {
    const bool isFile = description.starts_with('@');
    if (!isFile) Write("text.toml", description);
    return Run("pack " + (isFile ? description : "@text.toml") + " --stub " + stub + " -o " +
               output);
  }

  ImageBuilder sample;  // image.exe taken apart
};
