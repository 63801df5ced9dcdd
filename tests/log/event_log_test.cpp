// The events of a run as lines of a text file.
#include "log/event_log.h"

#include "core/driver.h"
#include "tests/support/product_test.h"
#include "tests/support/test_image.h"

namespace {

using EventLog = ProductTest;

constexpr char kLog[] = "drive_c/windows/MorivLog.txt";

TEST_F(EventLog, TheLongestLineFitsAndUnknownEventsAreLines) {
  const std::string longest(519, 's');
  ASSERT_EQ(AddEvent(&context.events, EventServicesRemain, SeverityFatal, longest.c_str()), 1);
  ASSERT_EQ(AddEvent(&context.events, 3, 3, nullptr), 1);
  ASSERT_EQ(AddEvent(&context.events, 39, 0, "beyond the table"), 1);
  ASSERT_EQ(AddEvent(&context.events, 0, 1, nullptr), 1);
  WriteEventLog(&context.events, nullptr, LogMode::kNew);
  EXPECT_TRUE(pc.Read(kLog).ends_with(longest +
                                      ". \r\n\r\n (Application will exit)\r\n"
                                      "2- Fatal Error : Cannot allocate memory . \r\n\r\n"
                                      " (Application will exit)\r\n"
                                      "3-  beyond the table\r\n"
                                      "4- Moriv Installation application . (Warning)\r\n"));
}

TEST_F(EventLog, ARunInALanguageWithoutRowsTellsThatItHasNoDirectory) {
  ImageBuilder image;
  image.header().defaultLanguage = 50000;
  image.Write(&pc);
  SetupRequest request = {};
  request.options = OptionSilent;
  request.language = kLanguageNone;
  EXPECT_EQ(RunSetup(request), StatusBadDirectory);
  EXPECT_TRUE(
      pc.Read(kLog).ends_with("1- Fatal Error : Invalid destination directory string :  . "
                              "\r\n\r\n (Application will exit)\r\n"));
}

}  // namespace
