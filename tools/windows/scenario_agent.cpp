// The Windows end of the scenario runner: starts programs and reads and writes the registry for it.
//
// A Linux exit status has 8 bits, so the full exit code of a program has to be told in words; and
// one process that stays for a whole session saves the start of a new one for every step. It also
// keeps the session alive: the system runs pending one-time commands when a session begins, and a
// scenario wants to see them first.
//
// Commands come on standard input, one a line; every answer ends with a line ".". Texts are in the
// code page, names of values and data are hexadecimal bytes ("-" for none), keys lie under
// HKEY_LOCAL_MACHINE.
//
//   run SECONDS PROGRAM<TAB>COMMAND    starts the program with exactly this command line and waits:
//                                      "exit code: N", "ended after N seconds" or
//                                      "cannot start: ERROR"
//   view BITS                          from now on keys are those that a program of 32 or 64 bits
//                                      sees; without it those that this program sees
//   key KEY                            makes the key; the values that follow are its own
//   value TYPE NAME DATA               sets a value
//   delete KEY                         deletes a key and all below it, if it is there
//   dump KEY                           prints the key and all below it as "key" and "value" lines;
//                                      nothing for a key that is not there
//
// A command that fails answers "failed: WHAT (ERROR)".

#include <windows.h>
// After windows.h.
#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <iostream>
#include <string>
#include <string_view>
#include <vector>

namespace {

// Cuts the first word off `line`; the blank behind it goes too.
std::string TakeWord(std::string* line, char separator = ' ') {
  const size_t end = std::min(line->find(separator), line->size());
  std::string word = line->substr(0, end);
  line->erase(0, end + 1);
  return word;
}

void PrintFailure(const char* what, LSTATUS error) {
  std::printf("failed: %s (%ld)\n", what, static_cast<long>(error));
}

void PrintHex(std::string_view bytes) {
  if (bytes.empty()) std::fputs("-", stdout);
  for (const char byte : bytes) std::printf("%02x", static_cast<unsigned char>(byte));
}

std::string BytesFromHex(const std::string& text) {
  std::string bytes;
  if (text == "-") return bytes;
  for (size_t i = 0; i + 1 < text.size(); i += 2) {
    bytes.push_back(static_cast<char>(std::strtoul(text.substr(i, 2).c_str(), nullptr, 16)));
  }
  return bytes;
}

void RunProgram(std::string line) {
  const DWORD seconds = std::strtoul(TakeWord(&line).c_str(), nullptr, 10);
  const std::string program = TakeWord(&line, '\t');
  STARTUPINFOA startup = {};
  startup.cb = sizeof startup;
  PROCESS_INFORMATION process = {};
  if (!CreateProcessA(program.c_str(), line.data(), nullptr, nullptr, FALSE, 0, nullptr, "C:\\",
                      &startup, &process)) {
    std::printf("cannot start: %lu\n", GetLastError());
    return;
  }
  if (WaitForSingleObject(process.hProcess, seconds * 1000) == WAIT_OBJECT_0) {
    DWORD code = 0;
    GetExitCodeProcess(process.hProcess, &code);
    std::printf("exit code: %d\n", static_cast<int>(code));
  } else {
    TerminateProcess(process.hProcess, 1);
    WaitForSingleObject(process.hProcess, 10000);
    std::printf("ended after %lu seconds\n", seconds);
  }
  CloseHandle(process.hThread);
  CloseHandle(process.hProcess);
}

REGSAM registryView = 0;

// The key that "value" acts on: the last one that "key" named.
HKEY selectedKey = nullptr;

void CloseSelectedKey() {
  if (selectedKey != nullptr) RegCloseKey(selectedKey);
  selectedKey = nullptr;
}

void SelectKey(const std::string& key) {
  CloseSelectedKey();
  const LSTATUS error =
      RegCreateKeyExA(HKEY_LOCAL_MACHINE, key.c_str(), 0, nullptr, 0, KEY_ALL_ACCESS | registryView,
                      nullptr, &selectedKey, nullptr);
  if (error != ERROR_SUCCESS) PrintFailure(key.c_str(), error);
}

void SetValue(std::string line) {
  const DWORD type = std::strtoul(TakeWord(&line).c_str(), nullptr, 10);
  const std::string name = BytesFromHex(TakeWord(&line));
  const std::string data = BytesFromHex(line);
  const LSTATUS error =
      RegSetValueExA(selectedKey, name.c_str(), 0, type, reinterpret_cast<const BYTE*>(data.data()),
                     static_cast<DWORD>(data.size()));
  if (error != ERROR_SUCCESS) PrintFailure(name.c_str(), error);
}

void DeleteKey(const std::string& key) {
  CloseSelectedKey();
  HKEY opened = nullptr;
  LSTATUS error =
      RegOpenKeyExA(HKEY_LOCAL_MACHINE, key.c_str(), 0, KEY_ALL_ACCESS | registryView, &opened);
  if (error == ERROR_FILE_NOT_FOUND) return;
  if (error == ERROR_SUCCESS) {
    error = RegDeleteTreeA(opened, nullptr);
    RegCloseKey(opened);
  }
  if (error == ERROR_SUCCESS) {
    error = RegDeleteKeyExA(HKEY_LOCAL_MACHINE, key.c_str(), registryView, 0);
  }
  if (error != ERROR_SUCCESS) PrintFailure(key.c_str(), error);
}

void DumpValues(HKEY key) {
  std::vector<char> name(16384);
  std::vector<BYTE> data(65536);
  for (DWORD index = 0;; ++index) {
    DWORD nameSize = static_cast<DWORD>(name.size());
    DWORD dataSize = static_cast<DWORD>(data.size());
    DWORD type = 0;
    const LSTATUS error =
        RegEnumValueA(key, index, name.data(), &nameSize, nullptr, &type, data.data(), &dataSize);
    if (error == ERROR_NO_MORE_ITEMS) return;
    if (error != ERROR_SUCCESS) return PrintFailure("value", error);
    std::printf("value %lu ", type);
    PrintHex({name.data(), nameSize});
    std::fputs(" ", stdout);
    PrintHex({reinterpret_cast<const char*>(data.data()), dataSize});
    std::fputs("\n", stdout);
  }
}

void DumpKey(const std::string& path) {
  HKEY key = nullptr;
  const LSTATUS error =
      RegOpenKeyExA(HKEY_LOCAL_MACHINE, path.c_str(), 0, KEY_READ | registryView, &key);
  if (error == ERROR_FILE_NOT_FOUND) return;
  if (error != ERROR_SUCCESS) return PrintFailure(path.c_str(), error);
  std::printf("key %s\n", path.c_str());
  DumpValues(key);
  char name[256];
  for (DWORD index = 0; RegEnumKeyA(key, index, name, sizeof name) == ERROR_SUCCESS; ++index) {
    DumpKey(path + "\\" + name);
  }
  RegCloseKey(key);
}

void CarryOut(std::string line) {
  const std::string command = TakeWord(&line);
  if (command == "run") {
    RunProgram(line);
  } else if (command == "view") {
    registryView = line == "64" ? KEY_WOW64_64KEY : KEY_WOW64_32KEY;
  } else if (command == "key") {
    SelectKey(line);
  } else if (command == "value") {
    SetValue(line);
  } else if (command == "delete") {
    DeleteKey(line);
  } else if (command == "dump") {
    DumpKey(line);
  } else {
    std::printf("failed: no such command: %s\n", command.c_str());
  }
}

}  // namespace

int main() {
  std::string line;
  while (std::getline(std::cin, line)) {
    if (!line.empty() && line.back() == '\r') line.pop_back();
    CarryOut(line);
    std::puts(".");
    std::fflush(stdout);
  }
  CloseSelectedKey();
  return 0;
}
