// The project's own decoders, fed as an install feeds them.
#include <algorithm>
#include <memory>

#include "bench/decoders.h"
#include "bench/plain_expander.h"
#include "package/expander.h"

#ifdef __GLIBC__
#include <malloc.h>
#endif

namespace {

constexpr size_t kBlockSize = 1024;

// Collects into pieces of 1024 bytes as for a file, and counts.
class CountingExpander : public PkzFileExpander {
 public:
  explicit CountingExpander(Output* output) : PkzFileExpander(nullptr), output_(output) {}

 protected:
  void WriteOutput(const uint8_t* bytes, uint32_t count) override {
    PkzFileExpander::WriteOutput(bytes, count);
    output_->Take(bytes, count);
  }

 private:
  Output* output_;
};

class CountingPlainExpander : public PlainExpander {
 public:
  explicit CountingPlainExpander(Output* output) : output_(output) {}

 protected:
  uint32_t Write(const uint8_t* bytes, uint32_t count) override {
    output_->Take(bytes, count);
    return count;
  }

 private:
  Output* output_;
};

template <class Expander>
bool DecodeInBlocks(Bytes stream, Output* output) {
  const auto expander = std::make_unique<Expander>(output);
  while (!stream.empty()) {
    const size_t count = std::min(stream.size(), kBlockSize);
    expander->ExpandBlock(stream.data(), static_cast<uint32_t>(count));
    stream = stream.subspan(count);
  }
  expander->Flush();
  return expander->failed() == 0;
}

}  // namespace

bool DecodeByExpander(Bytes stream, Output* output) {
  return DecodeInBlocks<CountingExpander>(stream, output);
}

bool DecodePlainly(Bytes stream, Output* output) {
  return DecodeInBlocks<CountingPlainExpander>(stream, output);
}

uint64_t ExpanderMemory() {
#ifdef __GLIBC__
  const auto used = [] {
    const struct mallinfo2 info = mallinfo2();
    return info.uordblks + info.hblkhd;  // small blocks, and those mapped on their own
  };
  const size_t before = used();
  const auto expander = std::make_unique<PkzFileExpander>(nullptr);
  return used() - before;
#else
  return 0;
#endif
}
