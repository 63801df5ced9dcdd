// The hooks of the passes in a run without a dialog.
#include "core/hooks.h"

#include "tests/support/product_test.h"

namespace {

using Hooks = ProductTest;

TEST_F(Hooks, AskTheSystemNothingWithoutAWindow) {
  FailNothing();  // counts calls from 0
  ShowMessage(&context, 104, "C:\\a.dll");
  wizardState.cancelRequested = 1;
  EXPECT_EQ(PollCancel(), 1u);
  EXPECT_EQ(context.messageId, 0u);
  EXPECT_EQ(machine::CallCount("LoadStringA") + machine::CallCount("PeekMessageA"), 0);
}

}  // namespace
