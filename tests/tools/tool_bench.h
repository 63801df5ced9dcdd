// A folder of its own for each test of a tool, with what a package is made of.
#pragma once

#include <gtest/gtest.h>

#include <cstdint>
#include <filesystem>
#include <functional>
#include <iosfwd>
#include <string>
#include <vector>

#include "package/package_format.h"
#include "tests/support/test_machine.h"

// What a tool said and how it ended.
struct ToolRun {
  int status = -1;
  std::string out;
  std::string err;
};

class ToolBench : public testing::Test, protected TemporaryFolder {
 protected:
  // Names of all that stands in a folder, sorted.
  std::vector<std::string> NamesIn(const std::string& folder) const;

  // Runs moriv-image; an argument "@name" is a path in the test's folder. A run that is refused
  // says so in one line and leaves the folder as it was.
  ToolRun RunImage(const std::vector<std::string>& arguments) const;
  // The same with moriv-machine.
  ToolRun RunMachine(const std::vector<std::string>& arguments) const;

  // It was refused, and this is a part of what it said.
  static void ExpectRefused(const ToolRun& run, const std::string& said = "");

  // Writes stub.exe, a.exe (45056 bytes, version 4.1.7), b.dll (random), empty.txt and setup.toml,
  // and packs them as image.exe, which must succeed.
  void PackSample() const;
  static const char* SampleDescription();

  // Changes the header or one record of image.exe, a good image of the sample.
  void ChangeHeader(const std::function<void(PackageHeader*)>& change) const;
  void ChangeRecord(size_t number, const std::function<void(FileRecord*)>& change) const;
  PackageHeader HeaderOf(const std::string& image) const;
  FileRecord RecordOf(const std::string& image, size_t number) const;

  // Offset of a record, counted from 0, in an image.
  size_t RecordOffset(const std::string& image, size_t number) const;

 private:
  using Tool = int (*)(int, const char* const*, std::ostream&, std::ostream&);
  ToolRun Run(Tool tool, std::vector<std::string> arguments) const;
};
