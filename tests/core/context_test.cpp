// The record of a run is put in order before work starts.
#include "core/context.h"

#include <gtest/gtest.h>

namespace {

TEST(Context, ARequestIsMadeWhole) {
  uint32_t options = 0;
  EXPECT_EQ(ApplyDefaultOptions(&options), StatusOk);
  EXPECT_EQ(options, OptionInteractive | OptionRegister);
  options = OptionRemove;
  EXPECT_EQ(ApplyDefaultOptions(&options), StatusOk);
  EXPECT_EQ(options, OptionRemove);
  EXPECT_EQ(ApplyDefaultOptions(nullptr), StatusBadArgument);

  for (const int32_t given : {-1, 0, 10000, 20000, 30000, 40000, 1, -2, 9999, 50000}) {
    int32_t language = given;
    EXPECT_EQ(ValidateLanguage(&language), StatusOk);
    EXPECT_EQ(language, given % 10000 == 0 && given < 50000 ? given : kLanguageNone);
  }
  EXPECT_EQ(ValidateLanguage(nullptr), StatusBadArgument);
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
  EXPECT_EQ(ApplyImageKind(nullptr), StatusBadArgument);
}

TEST(Status, ACodeWithoutAMessageOfItsOwnGetsTheGeneralOne) {
  for (const StatusCode code : {StatusOk, StatusBadArgument, StatusCopyFailed, StatusNoVersion,
                                StatusNoNetscape, 0, 100003, -1000022}) {
    EXPECT_EQ(MessageForStatus(code), 1000u) << code;
  }
  EXPECT_EQ(MessageForStatus(StatusBufferTooSmall), MessageForStatus(StatusNoMemory));
  EXPECT_EQ(MessageForStatus(StatusReadFailed), MessageForStatus(StatusSeekFailed));
}

}  // namespace
