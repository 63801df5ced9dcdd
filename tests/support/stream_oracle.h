// The image tool's reader of streams, which was written apart from the program's expander: what a
// stream expands to.
#pragma once

#include <string>
#include <string_view>
#include <vector>

#include "tools/image/stream_reader.h"

class StreamOracle {
 public:
  // Reads the next block as far as it has whole codes; the first one holds the magic.
  void Take(std::string_view block) {
    block_ = block;
    for (auto text = reader_.Next(); !text.empty(); text = reader_.Next()) {
      output.append(text.begin(), text.end());
      ends.push_back(output.size());
    }
  }

  bool failed() const { return !reader_.Fault().empty(); }

  std::string output;
  std::vector<size_t> ends;  // of each code's text in the output

 private:
  std::string_view block_;
  image::StreamReader reader_{[this](std::span<uint8_t> to) {
    const size_t count = block_.copy(reinterpret_cast<char*>(to.data()), to.size());
    block_.remove_prefix(count);
    return count;
  }};
};
