// A dialog whose controls and procedure are the test's own, played by a user's script.
#pragma once

#include <gtest/gtest.h>

#include <functional>
#include <string>
#include <vector>

#include "machine/dialog_template.h"
#include "machine/scripted_user.h"
#include "machine/windows.h"
#include "tests/support/test_machine.h"

inline constexpr uint32_t kShownControl = 0x50010000;  // WS_CHILD | WS_VISIBLE | WS_TABSTOP
inline constexpr uint32_t kOwnerDrawnList = 0x13;      // CBS_DROPDOWNLIST | CBS_OWNERDRAWFIXED

inline machine::TemplateItem Control(const char* className, uint16_t id,
                                     uint32_t style = kShownControl, const char* text = "") {
  return {
      .style = style, .width = 40, .height = 16, .id = id, .className = className, .text = text};
}

class DialogTest : public testing::Test {
 protected:
  using Handler = std::function<INT_PTR(HWND dialog, UINT message, WPARAM wParam, LPARAM lParam)>;

  // Runs the dialog to its end. Returns its result; `shown` is what came on standard output.
  INT_PTR Run(const std::vector<machine::TemplateItem>& controls, const std::string& script,
              Handler handlerOfTest) {
    pc.Write("user.txt", script);
    std::string error;
    EXPECT_TRUE(machine::LoadUser(pc.Host("user.txt"), &error)) << error;
    machine::DialogTemplate dialog;
    dialog.frame.text = "Title";
    dialog.controls = controls;
    handler = std::move(handlerOfTest);
    testing::internal::CaptureStdout();
    const INT_PTR result = machine::RunDialog(dialog, CallHandler, kData);
    machine::EndUser();
    shown = testing::internal::GetCapturedStdout();
    handler = nullptr;
    return result;
  }

  static constexpr LPARAM kData = 77;  // what WM_INITDIALOG brings
  TestMachine pc;
  std::string shown;

 private:
  static INT_PTR CALLBACK CallHandler(HWND dialog, UINT message, WPARAM wParam, LPARAM lParam) {
    return handler(dialog, message, wParam, lParam);
  }

  static inline Handler handler;
};
