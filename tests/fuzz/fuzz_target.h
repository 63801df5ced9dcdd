// What all fuzz targets share.
//
// A target is a test whose input an engine makes up. It states what must hold with the macros of
// GoogleTest, and the first that fails ends the process, as a finding of a sanitizer does. The same
// source is linked with libFuzzer, or with corpus_replay.cpp, which needs no engine.
#pragma once

#include <gtest/gtest.h>

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <string>
#include <string_view>

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size);

// GoogleTest's own flag for this can't be set here: it may be initialised after these lines.
class FailureEndsTheProcess : public testing::EmptyTestEventListener {
  void OnTestPartResult(const testing::TestPartResult& result) override {
    if (result.failed()) std::abort();
  }
};

inline const bool kFailureEndsTheProcess = [] {
  testing::UnitTest::GetInstance()->listeners().Append(new FailureEndsTheProcess);  // owned there
  return true;
}();

// The input, taken from its front. Behind its end there are zeros and empty texts.
class FuzzInput {
 public:
  FuzzInput(const uint8_t* data, size_t size) : rest_(reinterpret_cast<const char*>(data), size) {}

  uint8_t TakeByte() {
    if (rest_.empty()) return 0;
    const auto byte = static_cast<uint8_t>(rest_.front());
    rest_.remove_prefix(1);
    return byte;
  }

  // The bytes up to a line feed, which is dropped.
  std::string TakeLine() {
    const size_t length = std::min(rest_.find('\n'), rest_.size());
    std::string line(rest_.substr(0, length));
    rest_.remove_prefix(std::min(length + 1, rest_.size()));
    return line;
  }

  std::string_view rest() const { return rest_; }

 private:
  std::string_view rest_;
};
