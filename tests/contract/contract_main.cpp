// Runs every case, by name. Prints "ok NAME" or "failed NAME: what", one line a case, and a closing
// line with the counts. Returns 0 when all hold, else -1, which no exit status takes for a success.
#include <algorithm>
#include <cstdio>
#include <cstring>
#include <vector>

#include "tests/contract/contract.h"

namespace {

// Cases are registered before main; a local static is there when the first one comes.
std::vector<contract::Case>& Cases() {
  static std::vector<contract::Case> cases;
  return cases;
}

std::string failures;  // of the case that runs

// A key and all below it; one that is not there is no failure.
void DeleteTree(const std::string& path) {
  HKEY key = nullptr;
  if (RegOpenKeyExA(HKEY_LOCAL_MACHINE, path.c_str(), 0, KEY_READ, &key) != ERROR_SUCCESS) return;
  char name[MAX_PATH];
  while (RegEnumKeyA(key, 0, name, sizeof(name)) == ERROR_SUCCESS) {
    const std::string below = path + '\\' + name;
    DeleteTree(below);
  }
  RegCloseKey(key);
  RegDeleteKeyA(HKEY_LOCAL_MACHINE, path.c_str());
}

bool Holds(const contract::Case& one) {
  failures.clear();
  DeleteTree(contract::kKey);
  one.body();
  if (failures.empty()) {
    std::printf("ok %s\n", one.name);
  } else {
    std::printf("failed %s:%s\n", one.name, failures.c_str());
  }
  std::fflush(stdout);
  return failures.empty();
}

}  // namespace

namespace contract {

Case::Case(const char* caseName, void (*caseBody)()) : name(caseName), body(caseBody) {
  Cases().push_back(*this);
}

bool IsWine() {
  return GetProcAddress(GetModuleHandleA("ntdll.dll"), "wine_get_version") != nullptr;
}

void Expect(const Shown& actual, const Shown& expected, const std::string& row,
            std::source_location where) {
  if (actual.text == expected.text) return;
  const char* const slash = std::strrchr(where.file_name(), '/');
  failures += std::string(" ") + (slash != nullptr ? slash + 1 : where.file_name()) + ':' +
              std::to_string(where.line()) + (row.empty() ? "" : " [" + row + ']') + " is " +
              actual.text + ", not " + expected.text + ';';
}

void ExpectEach(std::initializer_list<Shown> actual, std::initializer_list<Shown> expected,
                const std::string& row, std::source_location where) {
  if (expected.size() != 1) Expect(expected.size(), actual.size(), "answers", where);
  const Shown* answer = expected.begin();
  for (const Shown& one : actual) {
    Expect(one, *answer, row + " call " + std::to_string(&one - actual.begin() + 1), where);
    if (answer + 1 != expected.end()) ++answer;
  }
}

HANDLE Open(const std::string& name, DWORD access, DWORD share) {
  return CreateFileA(name.c_str(), access, share, nullptr, OPEN_EXISTING, FILE_ATTRIBUTE_NORMAL,
                     nullptr);
}

HANDLE Create(const std::string& name, DWORD attributes) {
  return CreateFileA(name.c_str(), GENERIC_READ | GENERIC_WRITE, 0, nullptr, CREATE_ALWAYS,
                     attributes, nullptr);
}

bool Opens(HANDLE file) {
  return file != INVALID_HANDLE_VALUE && CloseHandle(file) != FALSE;
}

std::string Read(HANDLE file, DWORD count) {
  std::string bytes(count, '?');
  DWORD done = 99;
  if (ReadFile(file, bytes.data(), count, &done, nullptr) == FALSE) return "failed";
  bytes.resize(done);
  return bytes;
}

BOOL Write(HANDLE file, const std::string& bytes) {
  const auto count = static_cast<DWORD>(bytes.size());
  DWORD done = 99;
  const BOOL isWritten = WriteFile(file, bytes.data(), count, &done, nullptr);
  Expect(done, isWritten != FALSE ? count : 0);
  return isWritten;
}

void WriteText(const std::string& path, const std::string& bytes) {
  const HANDLE file = Create(path);
  ExpectEach({Write(file, bytes), CloseHandle(file)}, {TRUE}, path);
}

std::string ReadText(const std::string& path) {
  const HANDLE file = Open(path, GENERIC_READ);
  const DWORD size = GetFileSize(file, nullptr);
  const std::string bytes = Read(file, size != INVALID_FILE_SIZE ? size : 0);
  CloseHandle(file);
  return bytes;
}

}  // namespace contract

// A command line makes this the program that a case starts: it writes the file of that name.
int WINAPI WinMain(HINSTANCE, HINSTANCE, LPSTR commandLine, int) {
  if (*commandLine != '\0') {
    contract::WriteText(commandLine, "started");
    return 0;
  }
  std::vector<contract::Case>& cases = Cases();
  std::ranges::sort(cases,
                    [](const auto& a, const auto& b) { return std::strcmp(a.name, b.name) < 0; });
  const auto held = std::ranges::count_if(cases, Holds);
  const auto failed = static_cast<long long>(cases.size()) - held;
  DeleteTree(contract::kKey);
  std::printf("%lld held, %lld failed\n", static_cast<long long>(held), failed);
  return failed == 0 ? 0 : -1;
}
