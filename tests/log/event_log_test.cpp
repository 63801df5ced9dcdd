// The events of a run as lines of a text file.
#include "log/event_log.h"

#include "tests/support/product_test.h"

namespace {

using EventLog = ProductTest;

TEST_F(EventLog, TheLongestLineFitsAndUnknownEventsAreLines) {
  const std::string longest(519, 's');
  ASSERT_EQ(AddEvent(&context.events, EventServicesRemain, SeverityFatal, longest.c_str()), 1);
  ASSERT_EQ(AddEvent(&context.events, 3, 3, nullptr), 1);
  ASSERT_EQ(AddEvent(&context.events, 39, 0, "beyond the table"), 1);
  WriteEventLog(&context.events, nullptr, LogMode::kNew);
  EXPECT_TRUE(pc.Read("drive_c/windows/MorivLog.txt")
                  .ends_with(longest + ". \r\n\r\n (Application will exit)\r\n"
                                       "2- Fatal Error : Cannot allocate memory . \r\n\r\n"
                                       " (Application will exit)\r\n"
                                       "3-  beyond the table\r\n"));
}

}  // namespace
