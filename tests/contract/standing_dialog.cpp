#include "tests/contract/standing_dialog.h"

#include <utility>

namespace contract {
namespace {

Handler current;

INT_PTR CALLBACK CallHandler(HWND dialog, UINT message, WPARAM wParam, LPARAM lParam) {
  if (message == WM_INITDIALOG) PostMessageA(dialog, kStep, 0, 0);
  return current(dialog, message, wParam, lParam);
}

}  // namespace

INT_PTR RunDialog(Handler handler) {
  constexpr int kTemplate = 100;
  current = std::move(handler);
  return DialogBoxParamA(GetModuleHandleA(nullptr), MAKEINTRESOURCEA(kTemplate), nullptr,
                         CallHandler, kData);
}

void RunStanding(const std::function<void(HWND dialog)>& check) {
  const INT_PTR result = RunDialog([&](HWND dialog, UINT message, WPARAM, LPARAM) -> INT_PTR {
    if (message != kStep) return FALSE;
    check(dialog);
    return EndDialog(dialog, 5);
  });
  Expect(result, 5);
}

}  // namespace contract
