// From a command line to a request. What options and paths mean is held against a second reading of
// the rules in tests/fuzz/command_line_fuzz.cpp.
#include "core/command_line.h"

#include <gtest/gtest.h>

namespace {

TEST(CommandLine, MissingArgumentsAreRefused) {
  SetupRequest request = {};
  EXPECT_EQ(ParseCommandLine(nullptr, &request), 0);
  EXPECT_EQ(ParseCommandLine("/s", nullptr), 0);
  ApplyOption(nullptr, &request);
  ApplyOption("", &request);
  ApplyOption("s", nullptr);
  EXPECT_EQ(request.options, 0u);
}

}  // namespace
