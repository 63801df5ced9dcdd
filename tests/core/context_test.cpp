// The record of a run: its settings, its statuses and its events.
#include "core/context.h"

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

TEST(Status, EachHasItsNumberAndItsMessage) {
  const std::pair<StatusCode, uint32_t> stops[] = {
      {StatusBadArgument, 1000},      {StatusBufferTooSmall, 1002},     {StatusDeleteFailed, 1011},
      {StatusCreateFileFailed, 1005}, {StatusWriteRemovalFailed, 1009}, {StatusInternal, 1001},
      {StatusCreateDirFailed, 1006},  {StatusBadDirectory, 1003},       {StatusNoSystemDir, 1004},
      {StatusBadRecord, 1007},        {StatusCancelled, 1015},          {StatusDialogAborted, 1000},
      {StatusBadPackage, 1012},       {StatusNoMemory, 1002},           {StatusOpenFailed, 1008},
      {StatusReadFailed, 1010},       {StatusExpandFailed, 1013},       {StatusSeekFailed, 1010},
      {StatusServicesRemain, 1016},   {StatusNoModulePath, 1000},       {StatusNoDiskSpace, 1018},
      {StatusCopyFailed, 1000}};
  StatusCode number = -1000000;
  for (const auto& [status, message] : stops) {
    EXPECT_EQ(status, number--);
    EXPECT_EQ(MessageForStatus(status), message) << status;
  }
  number = 100001;  // of the soft ones; the third is not in use
  for (const StatusCode status :
       {StatusNoVersion, StatusRemovalProgramFailed, 100003, StatusNotRegistered, StatusNoNetscape,
        StatusNoExplorer, StatusNoOpera}) {
    EXPECT_EQ(status, number++);
    EXPECT_EQ(MessageForStatus(status), status == StatusNotRegistered ? 1014 : 1000u) << status;
  }
  for (const StatusCode status : {StatusOk, 0, number, -1000022}) {
    EXPECT_EQ(MessageForStatus(status), 1000u) << status;
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

TEST_F(Hooks, AskTheSystemNothingWithoutAWindow) {
  FailNothing();  // counts calls from 0
  ShowMessage(&context, 104, "C:\\a.dll");
  wizardState.cancelRequested = 1;
  EXPECT_EQ(PollCancel(), 1u);
  EXPECT_EQ(context.messageId, 0u);
  EXPECT_EQ(machine::CallCount("LoadStringA") + machine::CallCount("PeekMessageA"), 0);
}

}  // namespace
