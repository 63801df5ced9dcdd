// A stand-in machine in a temporary folder of its own, for one test.
#pragma once

#include <gtest/gtest.h>
#include <stdlib.h>

#include <cstdint>
#include <filesystem>
#include <fstream>
#include <sstream>
#include <string>

#include "machine/machine.h"
#include "platform/win32.h"

// Of a file of the host; empty when there is none.
inline std::string FileBytes(const std::filesystem::path& file) {
  std::ostringstream bytes;
  bytes << std::ifstream(file, std::ios::binary).rdbuf();
  return bytes.str();
}

class TemporaryFolder {
 public:
  TemporaryFolder() {
    std::string name = (std::filesystem::temp_directory_path() / "moriv-test-XXXXXX").string();
    EXPECT_NE(mkdtemp(name.data()), nullptr);
    path_ = std::filesystem::canonical(name);
  }
  ~TemporaryFolder() { std::filesystem::remove_all(path_); }

  TemporaryFolder(const TemporaryFolder&) = delete;
  TemporaryFolder& operator=(const TemporaryFolder&) = delete;

  const std::filesystem::path& Path() const { return path_; }

  // Host path of a file in it: "drive_c/windows/a.txt".
  std::filesystem::path Host(const std::string& path) const { return path_ / path; }

  // Writes a file, its directories too.
  void Write(const std::string& path, const std::string& bytes) const {
    std::filesystem::create_directories(Host(path).parent_path());
    std::ofstream(Host(path), std::ios::binary) << bytes;
  }

  std::string Read(const std::string& path) const { return FileBytes(Host(path)); }
  bool Has(const std::string& path) const { return std::filesystem::exists(Host(path)); }

 private:
  std::filesystem::path path_;
};

// Files are written and read behind the program's back.
class TestMachine : public TemporaryFolder {
 public:
  // Starts the machine with these settings, the text of machine.ini.
  explicit TestMachine(const std::string& settings = "") {
    if (!settings.empty()) Write("machine.ini", settings);
    Restart();
  }

  ~TestMachine() { machine::Stop(); }

  // Starts it anew, for a program whose file is `image` in the machine's folder ("" for none).
  void Restart(const std::string& image = "") {
    machine::Stop();
    std::string error;
    ASSERT_TRUE(machine::Start(Host(""), image.empty() ? "" : Host(image), &error)) << error;
  }
};

inline HANDLE Create(const char* name) {
  return CreateFileA(name, GENERIC_READ | GENERIC_WRITE, 0, nullptr, CREATE_ALWAYS, 0, nullptr);
}
