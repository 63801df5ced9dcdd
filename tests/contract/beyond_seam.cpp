#include "tests/contract/beyond_seam.h"

#ifdef _WIN32

namespace contract {
namespace {

int button;
std::string folder;

// The timer's message comes when no other waits, in the loop of the box or picker, which is then
// the active window of the thread.
void CALLBACK Answer(HWND, UINT, UINT_PTR timer, DWORD) {
  const HWND modal = GetActiveWindow();
  if (modal == nullptr) return;
  KillTimer(nullptr, timer);
  if (!folder.empty()) {
    SendMessageA(modal, BFFM_SETSELECTIONA, TRUE, reinterpret_cast<LPARAM>(folder.c_str()));
  }
  PostMessageA(modal, WM_COMMAND, static_cast<WPARAM>(button), 0);
}

}  // namespace

void AnswerNext(int pressed, const std::string& picked) {
  constexpr UINT kMilliseconds = 50;
  button = pressed;
  folder = picked;
  SetTimer(nullptr, 0, kMilliseconds, Answer);
}

void WaitForEnd(HANDLE process) {
  constexpr DWORD kMilliseconds = 30000;
  WaitForSingleObject(process, kMilliseconds);
}

}  // namespace contract

#endif
