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

inline std::string_view TextOf(const uint8_t* data, size_t size) {
  return {reinterpret_cast<const char*>(data), size};
}

// The input's first byte, which is taken off it; 0 behind its end.
inline uint8_t TakeByte(std::string_view* input) {
  if (input->empty()) return 0;
  const auto byte = static_cast<uint8_t>(input->front());
  input->remove_prefix(1);
  return byte;
}
