// The record of a run is put in order before work starts.
#include "core/context.h"

#include <gtest/gtest.h>

#include <cstdint>

namespace {

TEST(Context, ARequestIsMadeWhole) {
  uint32_t options = 0;
  EXPECT_EQ(ApplyDefaultOptions(&options), StatusOk);
  EXPECT_EQ(options, OptionInteractive | OptionRegister);
  options = OptionRemove;
  EXPECT_EQ(ApplyDefaultOptions(&options), StatusOk);
  EXPECT_EQ(options, OptionRemove);

  for (int32_t language : {-1, 0, 10000, 20000, 30000, 40000}) {
    const int32_t given = language;
    EXPECT_EQ(ValidateLanguage(&language), StatusOk);
    EXPECT_EQ(language, given);
  }
  for (int32_t language : {1, -2, 9999, 50000, INT32_MIN, INT32_MAX}) {
    EXPECT_EQ(ValidateLanguage(&language), StatusOk);
    EXPECT_EQ(language, kLanguageNone);
  }
}

TEST(Context, TheFlagOfARemovalProgramIsExactlyOne) {
  SetupContext context = {};
  for (const uint16_t flag : {uint16_t{0}, uint16_t{2}, uint16_t{0xFFFF}}) {
    context.header.removalImageFlag = flag;
    EXPECT_EQ(ApplyImageKind(&context), StatusOk);
    EXPECT_EQ(context.options, 0u) << flag;
  }
  context.header.removalImageFlag = 1;
  context.options = OptionSilent;
  EXPECT_EQ(ApplyImageKind(&context), StatusOk);
  EXPECT_EQ(context.options, OptionSilent | OptionRemove);
}

TEST(Context, NullIsRefused) {
  EXPECT_EQ(ApplyDefaultOptions(nullptr), StatusBadArgument);
  EXPECT_EQ(ValidateLanguage(nullptr), StatusBadArgument);
  EXPECT_EQ(ApplyImageKind(nullptr), StatusBadArgument);
}

TEST(Status, ACodeWithoutAMessageOfItsOwnGetsTheGeneralOne) {
  for (const StatusCode code :
       {StatusOk, StatusBadArgument, StatusDialogAborted, StatusNoModulePath, StatusCopyFailed,
        StatusNoVersion, StatusRemovalProgramFailed, StatusNoNetscape, 0, 100003, -1000022}) {
    EXPECT_EQ(MessageForStatus(code), 1000u) << code;
  }
  EXPECT_EQ(MessageForStatus(StatusBufferTooSmall), MessageForStatus(StatusNoMemory));
  EXPECT_EQ(MessageForStatus(StatusReadFailed), MessageForStatus(StatusSeekFailed));
}

}  // namespace
