#include "tests/contract/beyond_seam.h"

#ifdef _WIN32

#include <cstring>

namespace contract {
namespace {

int button;
std::string folder;

BOOL CALLBACK FindModal(HWND window, LPARAM found) {
  char className[8] = "";
  GetClassNameA(window, className, sizeof(className));
  const bool isDialog = std::strcmp(className, "#32770") == 0;
  if (!isDialog || IsWindowVisible(window) == FALSE || IsWindowEnabled(window) == FALSE)
    return TRUE;
  *reinterpret_cast<HWND*>(found) = window;
  return FALSE;
}

// The timer's message comes when no other waits, in the loop of the box or picker.
void CALLBACK Answer(HWND, UINT, UINT_PTR timer, DWORD) {
  HWND modal = nullptr;
  EnumThreadWindows(GetCurrentThreadId(), FindModal, reinterpret_cast<LPARAM>(&modal));
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
