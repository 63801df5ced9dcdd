// A dialog of contract.rc that runs with a handler of the case's own. What a real window does
// besides, for its own sake, is not looked at.
#pragma once

#include <functional>

#include "tests/contract/contract.h"

namespace contract {

// Messages that are posted: the first by the dialog itself, when it is made.
inline constexpr UINT kStep = 0x8001;
inline constexpr UINT kNextStep = 0x8002;
inline constexpr UINT kLastStep = 0x8003;

inline constexpr LPARAM kData = 77;  // what WM_INITDIALOG brings

inline bool IsStep(UINT message) {
  return message == kStep || message == kNextStep || message == kLastStep;
}

inline uint32_t StyleOf(HWND window) {
  return static_cast<uint32_t>(GetWindowLongA(window, GWL_STYLE));
}

using Handler = std::function<INT_PTR(HWND dialog, UINT message, WPARAM wParam, LPARAM lParam)>;

// The dialog's result.
INT_PTR RunDialog(Handler handler);

// Runs `check` in a dialog that stands, and ends it.
void RunStanding(const std::function<void(HWND dialog)>& check);

}  // namespace contract
