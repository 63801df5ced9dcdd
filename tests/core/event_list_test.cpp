// The list of what happened in a run.
#include "core/event_list.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <string>

#include "tests/support/allocation_faults.h"

namespace {

class EventListTest : public testing::Test {
 protected:
  void TearDown() override { EXPECT_EQ(FreeEventList(&list), StatusOk); }

  const EventEntry& Last() const { return list.entries[list.count - 1]; }

  EventList list = {};
};

TEST_F(EventListTest, EntriesStayAsTheyAreWhileTheListGrows) {
  for (uint32_t i = 0; i < 50; ++i) {
    ASSERT_EQ(AddEvent(&list, i, i % 3, std::to_string(i).c_str()), StatusOk);
    ASSERT_EQ(list.count, static_cast<int32_t>(i + 1));
  }
  for (uint32_t i = 0; i < 50; ++i) {
    EXPECT_EQ(list.entries[i].code, i);
    EXPECT_EQ(list.entries[i].severity, i % 3);
    EXPECT_EQ(list.entries[i].text, std::to_string(i));
  }
}

TEST_F(EventListTest, ATextIsCutTo519CharactersAndFilledUpWithZeros) {
  EXPECT_EQ(AddEvent(&list, 1, 0, nullptr), StatusOk);
  EXPECT_EQ(std::count(std::begin(Last().text), std::end(Last().text), '\0'), 520);
  for (const size_t length : {size_t{0}, size_t{519}, size_t{520}, size_t{5000}}) {
    ASSERT_EQ(AddEvent(&list, 1, 0, std::string(length, 'x').c_str()), StatusOk);
    EXPECT_EQ(std::string(Last().text), std::string(std::min<size_t>(length, 519), 'x'));
  }
}

TEST_F(EventListTest, WithoutMemoryTheListStaysAsItWas) {
  FailAllocation(1);
  EXPECT_EQ(AddEvent(&list, 1, 0, "a"), StatusNoMemory);
  EXPECT_EQ(list.entries, nullptr);
  ASSERT_EQ(AddEvent(&list, 2, 0, "b"), StatusOk);
  const EventEntry* const entries = list.entries;
  FailAllocation(1);
  EXPECT_EQ(AddEvent(&list, 3, 0, "c"), StatusNoMemory);
  EXPECT_EQ(list.count, 1);
  EXPECT_EQ(list.entries, entries);
  EXPECT_STREQ(Last().text, "b");
}

TEST_F(EventListTest, AFreedListStartsAnewAndNoneIsRefused) {
  ASSERT_EQ(AddEvent(&list, 1, 0, nullptr), StatusOk);
  for (int i = 0; i < 2; ++i) EXPECT_EQ(FreeEventList(&list), StatusOk);
  ASSERT_EQ(AddEvent(&list, 2, 0, nullptr), StatusOk);
  EXPECT_EQ(list.count, 1);
  EXPECT_EQ(InitEventList(nullptr), StatusBadPackage);
  EXPECT_EQ(AddEvent(nullptr, 1, 0, "a"), StatusBadArgument);
  EXPECT_EQ(FreeEventList(nullptr), StatusBadArgument);
}

}  // namespace
