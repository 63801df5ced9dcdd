// The events of a run as lines of a text file.
#include "log/event_log.h"

#include "tests/support/product_test.h"

namespace {

class EventLog : public ProductTest {
 protected:
  void Add(uint32_t code, uint32_t severity, const char* text = nullptr) {
    ASSERT_EQ(AddEvent(&context.events, code, severity, text), StatusOk);
  }
};

TEST_F(EventLog, SeverityGivesTheForm) {
  pc.Write("machine.ini", "[system]\nnow = 2026-02-03T04:05:06\n");
  pc.Restart();
  Add(19, 0);
  Add(28, 2, "C:\\x");
  Add(23, 1);
  Add(3, 3);
  Add(39, 0, "beyond the table");
  WriteEventLog(nullptr, "C:\\log.txt", LogMode::kAppend);
  WriteEventLog(&context.events, "C:\\log.txt", LogMode::kNew);
  EXPECT_EQ(pc.Read("drive_c/log.txt"),
            "\r\n\r\nInstalling Moriv : Tuesday, 03 February 2026 at : 04h 05m 06s \r\n\r\n"
            "1- Unistalling Moriv from the system \r\n"
            "2- Fatal Error : Cannot create the file path for :  C:\\x. \r\n\r\n"
            " (Application will exit)\r\n"
            "3- Cannot find Netscape, Moriv Plugin will not be installed for this web browser "
            ". (Warning)\r\n"
            "4- Fatal Error : Cannot allocate memory . \r\n\r\n (Application will exit)\r\n"
            "5-  beyond the table\r\n");
}

TEST_F(EventLog, TheLongestLineFits) {
  Add(20, 2, std::string(519, 's').c_str());
  WriteEventLog(&context.events, nullptr, LogMode::kNew);
  const std::string log = pc.Read("drive_c/windows/MorivLog.txt");
  EXPECT_NE(log.find(std::string(519, 's') + ". \r\n\r\n (Application will exit)\r\n"),
            std::string::npos);
}

}  // namespace
