// The record of a run: its settings, its statuses and its events.
#include "core/context.h"
#include "core/help.h"

#include <string>

#include "tests/support/allocation_faults.h"
#include "tests/support/product_test.h"

namespace {

TEST(Context, OnlyKnownLanguagesAndTheImageKindOfExactlyOneCount) {
  for (const int32_t given : {-1, 0, 10000, 20000, 30000, 40000, 1, -2, 9999, 50000}) {
    int32_t language = given;
    EXPECT_EQ(ValidateLanguage(&language), StatusOk);
    EXPECT_EQ(language, given % 10000 == 0 && given < 50000 ? given : kLanguageNone);
  }
  for (const uint16_t flag : {uint16_t{0}, uint16_t{1}, uint16_t{2}, uint16_t{0xFFFF}}) {
    SetupContext context = {};
    context.options = OptionSilent;
    context.header.removalImageFlag = flag;
    EXPECT_EQ(ApplyImageKind(&context), StatusOk);
    EXPECT_EQ(context.options, flag == 1 ? OptionSilent | OptionRemove : OptionSilent) << flag;
  }
  for (const StatusCode status :
       {ApplyDefaultOptions(nullptr), ValidateLanguage(nullptr), ApplyImageKind(nullptr)}) {
    EXPECT_EQ(status, StatusBadArgument);
  }
}

TEST(Status, EachStopHasItsMessage) {
  const uint32_t messages[] = {1000, 1002, 1011, 1005, 1009, 1001, 1006, 1003, 1004, 1007, 1015,
                               1000, 1012, 1002, 1008, 1010, 1013, 1010, 1016, 1000, 1018, 1000};
  StatusCode status = StatusBadArgument;  // counted downwards
  for (const uint32_t message : messages) EXPECT_EQ(MessageForStatus(status--), message) << status;
  for (status = -1000024; status <= 100008; ++status) {
    if (status == -1000021) status = -1;  // to those that stop nothing
    EXPECT_EQ(MessageForStatus(status), status == StatusNotRegistered ? 1014u : 1000u) << status;
  }
}

TEST(EventList, EntriesStayAsTheyAreWhileItGrowsAndTextsAreCutTo519Characters) {
  EventList list = {};
  const auto text = [](uint32_t i) { return std::string(i * 20, static_cast<char>('a' + i)); };
  for (uint32_t i = 0; i < 30; ++i) {
    ASSERT_EQ(AddEvent(&list, i, i % 3, i != 0 ? text(i).c_str() : nullptr), StatusOk);
  }
  FailAllocation(1);
  EXPECT_EQ(AddEvent(&list, 30, 0, "a"), StatusNoMemory);
  ASSERT_EQ(list.count, 30);
  for (uint32_t i = 0; i < 30; ++i) {
    EXPECT_EQ(list.entries[i].code, i);
    EXPECT_EQ(list.entries[i].severity, i % 3);
    EXPECT_EQ(list.entries[i].text, text(i).substr(0, 519));
  }
  for (int i = 0; i < 2; ++i) EXPECT_EQ(FreeEventList(&list), StatusOk);
  FailAllocation(1);
  EXPECT_EQ(AddEvent(&list, 1, 0, "a"), StatusNoMemory);
  EXPECT_EQ(list.count, 0);
  EXPECT_EQ(list.entries, nullptr);
  EXPECT_EQ(InitEventList(nullptr), StatusBadPackage);
  EXPECT_EQ(AddEvent(nullptr, 1, 0, "a"), StatusBadArgument);
  EXPECT_EQ(FreeEventList(nullptr), StatusBadArgument);
}

using Hooks = ProductTest;

TEST_F(Hooks, AReportFileMayHaveANameOfOneCharacter) {
  context.options = OptionSilent;
  ASSERT_TRUE(CopyText(context.reportFile, "a"));
  ShowHelp(&context);
  EXPECT_TRUE(pc.Has("drive_c/a"));
}

TEST_F(Hooks, AskTheSystemNothingWithoutAWindow) {
  FailNothing();  // counts calls from 0
  ShowMessage(&context, 104, "C:\\a.dll");
  wizardState.cancelRequested = 1;
  EXPECT_EQ(PollCancel(), 1u);
  EXPECT_EQ(context.messageId, 0u);
  EXPECT_EQ(machine::CallCount("LoadStringA") + machine::CallCount("PeekMessageA"), 0);
}

}  // namespace
