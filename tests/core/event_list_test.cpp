// The list of what happened in a run.
#include "core/event_list.h"

#include <gtest/gtest.h>

#include <string>

#include "tests/support/allocation_faults.h"

namespace {

TEST(EventList, EntriesStayAsTheyAreWhileItGrowsAndTextsAreCutTo519Characters) {
  EventList list = {};
  const auto text = [](uint32_t i) { return std::string(i * 20, static_cast<char>('a' + i)); };
  for (uint32_t i = 0; i < 30; ++i) {
    ASSERT_EQ(AddEvent(&list, i, i % 3, i != 0 ? text(i).c_str() : nullptr), StatusOk);
  }
  ASSERT_EQ(list.count, 30);
  for (uint32_t i = 0; i < 30; ++i) {
    EXPECT_EQ(list.entries[i].code, i);
    EXPECT_EQ(list.entries[i].severity, i % 3);
    EXPECT_EQ(list.entries[i].text, text(i).substr(0, 519));
  }
  for (int i = 0; i < 2; ++i) EXPECT_EQ(FreeEventList(&list), StatusOk);
  EXPECT_EQ(list.count, 0);
}

TEST(EventList, WithoutMemoryItStaysAsItWas) {
  EventList list = {};
  FailAllocation(1);
  EXPECT_EQ(AddEvent(&list, 1, 0, "a"), StatusNoMemory);
  EXPECT_EQ(list.entries, nullptr);
  ASSERT_EQ(AddEvent(&list, 2, 0, "b"), StatusOk);
  FailAllocation(1);
  EXPECT_EQ(AddEvent(&list, 3, 0, "c"), StatusNoMemory);
  EXPECT_EQ(list.count, 1);
  EXPECT_STREQ(list.entries[0].text, "b");
  EXPECT_EQ(FreeEventList(&list), StatusOk);
  EXPECT_EQ(InitEventList(nullptr), StatusBadPackage);
  EXPECT_EQ(AddEvent(nullptr, 1, 0, "a"), StatusBadArgument);
  EXPECT_EQ(FreeEventList(nullptr), StatusBadArgument);
}

}  // namespace
