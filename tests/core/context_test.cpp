// The record of a run is put in order before work starts.
#include "core/context.h"

#include <gtest/gtest.h>

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
  EXPECT_EQ(ApplyDefaultOptions(nullptr), StatusBadArgument);
  EXPECT_EQ(ValidateLanguage(nullptr), StatusBadArgument);
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
