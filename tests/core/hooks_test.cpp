// The hooks of the passes in a run without a dialog.
#include "core/hooks.h"

#include "tests/support/product_test.h"

namespace {

using Hooks = ProductTest;

TEST_F(Hooks, ShowNothingAndAskTheSystemNothingWithoutAWindow) {
  context.messageId = 7;
  FailNothing();
  ShowMessage(&context, 104, "C:\\a.dll");
  ShowMessage(nullptr, 104, nullptr);
  EXPECT_EQ(context.messageId, 7u);
  EXPECT_EQ(PollCancel(), 0u);
  wizardState.cancelRequested = 1;
  EXPECT_EQ(PollCancel(), 1u);
  for (const char* function : {"LoadStringA", "GetDlgItem", "SendMessageA", "PeekMessageA"}) {
    EXPECT_EQ(machine::CallCount(function), 0) << function;
  }
}

}  // namespace
