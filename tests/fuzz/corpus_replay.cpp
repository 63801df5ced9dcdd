// Runs every file of a corpus folder through a fuzz target, in the order of their names.
#include <cstdio>
#include <filesystem>
#include <set>

#include "tests/fuzz/fuzz_target.h"
#include "tests/support/test_machine.h"

int main(int argc, char** argv) {
  if (argc != 2) return 2;
  std::set<std::filesystem::path> files;
  for (const auto& entry : std::filesystem::directory_iterator(argv[1])) files.insert(entry);
  for (const std::filesystem::path& file : files) {
    const std::string bytes = FileBytes(file);
    std::printf("%s: %zu bytes\n", file.filename().c_str(), bytes.size());
    std::fflush(stdout);  // the last line names the file that ended the process
    (void)LLVMFuzzerTestOneInput(reinterpret_cast<const uint8_t*>(bytes.data()), bytes.size());
  }
  std::printf("%zu files\n", files.size());
  return files.empty() ? 1 : 0;
}
