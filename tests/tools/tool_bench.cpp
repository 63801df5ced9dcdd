#include "tests/tools/tool_bench.h"

#include <algorithm>
#include <cstring>
#include <sstream>

#include "tests/support/test_image.h"
#include "tools/image/image_command_line.h"
#include "tools/machine/machine_command_line.h"

namespace fs = std::filesystem;

namespace {

template <class Record>
Record RecordAt(const std::string& image, size_t offset) {
  Record record;
  std::memcpy(&record, image.data() + offset, sizeof record);
  return record;
}

template <class Record>
void Change(std::string* image, size_t offset, const std::function<void(Record*)>& change) {
  Record record = RecordAt<Record>(*image, offset);
  change(&record);
  std::memcpy(image->data() + offset, &record, sizeof record);
}

}  // namespace

std::vector<std::string> ToolBench::NamesIn(const std::string& folder) const {
  std::vector<std::string> names;
  for (const auto& entry : fs::directory_iterator(Host(folder))) {
    names.push_back(entry.path().filename().string());
  }
  std::sort(names.begin(), names.end());
  return names;
}

ToolRun ToolBench::RunImage(const std::vector<std::string>& arguments) const {
  return Run(image::RunImageTool, arguments);
}

ToolRun ToolBench::RunMachine(const std::vector<std::string>& arguments) const {
  return Run(machine_tool::RunMachineTool, arguments);
}

ToolRun ToolBench::Run(Tool tool, std::vector<std::string> arguments) const {
  std::vector<const char*> argv = {"tool"};
  for (std::string& argument : arguments) {
    if (argument.starts_with('@')) argument = Host(argument.substr(1)).string();
    argv.push_back(argument.c_str());
  }
  const std::vector<std::string> before = NamesIn(".");
  std::ostringstream out;
  std::ostringstream err;
  const int status = tool(static_cast<int>(argv.size()), argv.data(), out, err);
  if (status == 2) {
    EXPECT_EQ(err.str().find('\n'), err.str().size() - 1) << err.str();
    EXPECT_EQ(NamesIn("."), before) << err.str();
  }
  return {status, out.str(), err.str()};
}

void ToolBench::ExpectRefused(const ToolRun& run, const std::string& said) {
  EXPECT_EQ(run.status, 2) << said;
  EXPECT_NE(run.err.find(said), std::string::npos) << said << ": " << run.err;
}

const char* ToolBench::SampleDescription() {
  return R"([package]
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
}

void ToolBench::PackSample() const {
  Write("stub.exe", VersionedProgram("1.0.0"));
  std::string program = VersionedProgram("4.1.7");
  program.resize(45056);
  Write("a.exe", program);
  Write("b.dll", RandomBytes(3000, 1));
  Write("empty.txt", "");
  Write("setup.toml", SampleDescription());
  const ToolRun run = RunImage({"pack", "@setup.toml", "--stub", "@stub.exe", "-o", "@image.exe"});
  ASSERT_EQ(run.status, 0) << run.err;
}

void ToolBench::ChangeHeader(const std::function<void(PackageHeader*)>& change) const {
  std::string image = Read("image.exe");
  Change(&image, image.size() - sizeof(PackageHeader), change);
  Write("image.exe", image);
}

void ToolBench::ChangeRecord(size_t number, const std::function<void(FileRecord*)>& change) const {
  std::string image = Read("image.exe");
  Change(&image, RecordOffset("image.exe", number), change);
  Write("image.exe", image);
}

PackageHeader ToolBench::HeaderOf(const std::string& image) const {
  const std::string bytes = Read(image);
  return RecordAt<PackageHeader>(bytes, bytes.size() - sizeof(PackageHeader));
}

FileRecord ToolBench::RecordOf(const std::string& image, size_t number) const {
  return RecordAt<FileRecord>(Read(image), RecordOffset(image, number));
}

size_t ToolBench::RecordOffset(const std::string& image, size_t number) const {
  const std::string bytes = Read(image);
  size_t offset = HeaderOf(image).dataOffset;
  while (number-- > 0) {
    offset += sizeof(FileRecord) + RecordAt<FileRecord>(bytes, offset).storedSize;
  }
  return offset;
}
