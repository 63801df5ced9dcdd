// Runs every case, by name. Prints "ok NAME" or "failed NAME: what", one line a case, and a closing
// line with the counts. Returns 0 when all hold, else -1, which no exit status takes for a success.
#include <algorithm>
#include <cstdio>
#include <map>

#include "platform/entry.h"
#include "tests/contract/contract.h"

namespace {

// Cases are registered before main; a local static is there when the first one comes.
std::map<std::string, void (*)()>& Cases() {
  static std::map<std::string, void (*)()> cases;
  return cases;
}

std::string failures;  // of the case that runs
contract::Handler handlerOfCase;
HWND openDialog;

// A key and all below it; one that is not there is no failure.
void DeleteTree(const std::string& path) {
  HKEY key = nullptr;
  if (RegOpenKeyExA(HKEY_LOCAL_MACHINE, path.c_str(), 0, KEY_READ, &key) != ERROR_SUCCESS) return;
  char name[MAX_PATH];
  while (RegEnumKeyA(key, 0, name, sizeof(name)) == ERROR_SUCCESS) {
    DeleteTree(std::string(path).append("\\").append(name));
  }
  RegCloseKey(key);
  RegDeleteKeyA(HKEY_LOCAL_MACHINE, path.c_str());
}

INT_PTR CALLBACK CallHandler(HWND dialog, UINT message, WPARAM wParam, LPARAM lParam) {
  openDialog = dialog;
  if (message == WM_INITDIALOG) PostMessageA(dialog, contract::kStep, 0, 0);
  return handlerOfCase(dialog, message, wParam, lParam);
}

}  // namespace

namespace contract {

bool AddCase(const char* name, void (*body)()) {
  return Cases().emplace(name, body).second;
}

void Expect(Answers actual, Answers expected, const std::string& row, std::source_location where) {
  for (size_t call = 0; call < actual.size(); ++call) {
    const std::string& is = (actual.begin() + call)->text;
    const std::string wanted = expected.size() == 1      ? expected.begin()->text
                               : call >= expected.size() ? "without an answer"
                                                         : (expected.begin() + call)->text;
    if (is == wanted) continue;
    const std::string file = where.file_name();
    failures.append(" ").append(file.substr(file.rfind('/') + 1)).append(":");
    failures.append(std::to_string(where.line())).append(" [").append(row).append("] call ");
    failures.append(std::to_string(call + 1)).append(" is ").append(is).append(", not ");
    failures.append(wanted).append(";");
  }
}

bool IsWine() {
  return GetProcAddress(GetModuleHandleA("ntdll.dll"), "wine_get_version") != nullptr;
}

HANDLE Open(const std::string& name, DWORD access, DWORD share) {
  return CreateFileA(name.c_str(), access, share, nullptr, OPEN_EXISTING, 0, nullptr);
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
  Expect({done}, {isWritten != FALSE ? count : 0});
  return isWritten;
}

void WriteText(const std::string& name, const std::string& bytes) {
  const HANDLE file = Create(name);
  Expect({Write(file, bytes), CloseHandle(file)}, {TRUE}, name);
}

std::string ReadText(const std::string& name) {
  const HANDLE file = Open(name);
  const DWORD size = GetFileSize(file, nullptr);
  const std::string bytes = Read(file, size != INVALID_FILE_SIZE ? size : 0);
  CloseHandle(file);
  return bytes;
}

HWND Item(int id) {
  return GetDlgItem(openDialog, id);
}

INT_PTR RunDialog(Handler handler) {
  constexpr int kTemplate = 100;
  handlerOfCase = std::move(handler);
  return DialogBoxParamA(GetModuleHandleA(nullptr), MAKEINTRESOURCEA(kTemplate), nullptr,
                         CallHandler, kData);
}

void RunStanding(const Check& check, const Check& atNextStep) {
  const INT_PTR result = RunDialog([&](HWND dialog, UINT message, WPARAM, LPARAM) -> INT_PTR {
    if (message == kNextStep && atNextStep) atNextStep(dialog);
    if (message != kStep) return FALSE;
    check(dialog);
    return EndDialog(dialog, 5);
  });
  Expect({result}, {5});
}

#ifdef _WIN32

static int buttonOfUser;
static std::string folderOfUser;

// The timer's message comes when no other waits, in the loop of the box or picker, which is then
// the active window of the thread.
static void CALLBACK Answer(HWND, UINT, UINT_PTR timer, DWORD) {
  const HWND modal = GetActiveWindow();
  if (modal == nullptr) return;
  KillTimer(nullptr, timer);
  if (!folderOfUser.empty()) {
    SendMessageA(modal, BFFM_SETSELECTIONA, TRUE, reinterpret_cast<LPARAM>(folderOfUser.c_str()));
  }
  PostMessageA(modal, WM_COMMAND, static_cast<WPARAM>(buttonOfUser), 0);
}

void AnswerNext(int button, const std::string& folder) {
  constexpr UINT kMilliseconds = 50;
  buttonOfUser = button;
  folderOfUser = folder;
  SetTimer(nullptr, 0, kMilliseconds, Answer);
}

void WaitForEnd(HANDLE process) {
  constexpr DWORD kMilliseconds = 30000;
  WaitForSingleObject(process, kMilliseconds);
}

#else

void AnswerNext(int, const std::string&) {}
void WaitForEnd(HANDLE) {}

#endif

}  // namespace contract

// An argument makes this the program that a case starts: it writes the file of that name.
int RunProgram() {
  const std::string line = GetCommandLineA();
  const size_t argument = line.find_first_not_of("\" ", line.find(".exe") + 4);
  if (argument != std::string::npos) {
    contract::WriteText(line.substr(argument), "started");
    return 0;
  }
  int failed = 0;
  for (const auto& [name, body] : Cases()) {
    failures.clear();
    DeleteTree(contract::kKey);
    body();
    failed += failures.empty() ? 0 : 1;
    std::printf("%s %s%s%s\n", failures.empty() ? "ok" : "failed", name.c_str(),
                failures.empty() ? "" : ":", failures.c_str());
    std::fflush(stdout);
  }
  DeleteTree(contract::kKey);
  std::printf("%d held, %d failed\n", static_cast<int>(Cases().size()) - failed, failed);
  return failed == 0 ? 0 : -1;
}

#ifdef _WIN32
int WINAPI WinMain(HINSTANCE, HINSTANCE, LPSTR, int) {
  return RunProgram();
}
#endif
