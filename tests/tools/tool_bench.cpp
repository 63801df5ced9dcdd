#include "tests/tools/tool_bench.h"

#include <algorithm>
#include <cstring>
#include <fstream>
#include <random>
#include <sstream>

#include "machine/host_file.h"
#include "tests/support/executable_builder.h"
#include "tools/image/image_command_line.h"
#include "tools/machine/machine_command_line.h"

namespace fs = std::filesystem;

namespace {

template <class Record>
Record RecordAt(const std::vector<uint8_t>& image, size_t offset) {
  Record record;
  std::memcpy(&record, image.data() + offset, sizeof record);
  return record;
}

template <class Record>
void Change(std::vector<uint8_t>* image, size_t offset,
            const std::function<void(Record*)>& change) {
  Record record = RecordAt<Record>(*image, offset);
  change(&record);
  std::memcpy(image->data() + offset, &record, sizeof record);
}

}  // namespace

void ToolBench::Write(const std::string& name, std::span<const uint8_t> bytes) const {
  Write(name, std::string(bytes.begin(), bytes.end()));
}

void ToolBench::Write(const std::string& name, const std::string& text) const {
  ASSERT_TRUE(std::ofstream(Path(name), std::ios::binary) << text << std::flush) << name;
}

std::vector<uint8_t> ToolBench::Read(const std::string& name) const {
  return machine::ReadHostFile(Path(name)).value();
}

std::string ToolBench::ReadText(const std::string& name) const {
  const std::vector<uint8_t> bytes = Read(name);
  return {bytes.begin(), bytes.end()};
}

std::vector<std::string> ToolBench::NamesIn(const std::string& folder) const {
  std::vector<std::string> names;
  for (const auto& entry : fs::directory_iterator(Path(folder))) {
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
    if (argument.starts_with('@')) argument = Path(argument.substr(1)).string();
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
  Write("stub.exe", MakeProgram("1.0.0"));
  std::string program = MakeProgram("4.1.7");
  program.resize(45056);
  Write("a.exe", program);
  Write("b.dll", RandomBytes(3000, 1));
  Write("empty.txt", std::string());
  Write("setup.toml", SampleDescription());
  const ToolRun run = RunImage({"pack", "@setup.toml", "--stub", "@stub.exe", "-o", "@image.exe"});
  ASSERT_EQ(run.status, 0) << run.err;
}

void ToolBench::ChangeHeader(const std::function<void(PackageHeader*)>& change) const {
  std::vector<uint8_t> image = Read("image.exe");
  Change(&image, image.size() - sizeof(PackageHeader), change);
  Write("image.exe", image);
}

void ToolBench::ChangeRecord(size_t number, const std::function<void(FileRecord*)>& change) const {
  std::vector<uint8_t> image = Read("image.exe");
  Change(&image, RecordOffset("image.exe", number), change);
  Write("image.exe", image);
}

PackageHeader ToolBench::HeaderOf(const std::string& image) const {
  const std::vector<uint8_t> bytes = Read(image);
  return RecordAt<PackageHeader>(bytes, bytes.size() - sizeof(PackageHeader));
}

FileRecord ToolBench::RecordOf(const std::string& image, size_t number) const {
  return RecordAt<FileRecord>(Read(image), RecordOffset(image, number));
}

size_t ToolBench::RecordOffset(const std::string& image, size_t number) const {
  const std::vector<uint8_t> bytes = Read(image);
  size_t offset = HeaderOf(image).dataOffset;
  while (number-- > 0) {
    offset += sizeof(FileRecord) + RecordAt<FileRecord>(bytes, offset).storedSize;
  }
  return offset;
}

std::string MakeProgram(const std::string& version, bool hasTranslation) {
  std::vector<std::pair<std::string, std::string>> strings;
  if (!version.empty()) strings.emplace_back("FileVersion", version);
  return PortableExecutable(false, 16, 1,
                            {{0x40C, VersionResource(strings, 0x40C, 0x4B0, hasTranslation)}});
}

std::vector<uint8_t> RandomBytes(size_t count, unsigned seed) {
  std::mt19937 random(seed);
  std::vector<uint8_t> bytes(count);
  for (uint8_t& byte : bytes) byte = static_cast<uint8_t>(random());
  return bytes;
}
