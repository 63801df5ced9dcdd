// The expander of the packaged streams: a push decoder of variable-width LZW codes.
//
// A stream is three bytes of magic, "PKZ", and a sequence of codes, most significant bit first,
// with no gaps. Codes begin with 9 bits. 0 to 255 stand for themselves, behind 257 the codes have
// one bit more, 258 forgets the table and sets the width back to 9, and from 259 on a code is an
// entry of the table: the string of its prefix, then its suffix. The first code, and the first
// after a 258, is a literal; each later one but 257 and 258 makes the next entry. The stream has no
// end code: it ends with its last byte, and bits left over that make no code are dropped.
//
// A stream comes in blocks, as long as one likes; the end of a block may split a code. An expander
// serves one stream. Its memory is fixed and allocated once.
#pragma once

#include <cstdint>
#include <memory>

#include "package/string_table.h"

class DataFile;

inline constexpr char kStreamMagic[] = "PKZ";
inline constexpr uint32_t kStreamMagicSize = 3;

class PkzExpander {
 public:
  PkzExpander();
  virtual ~PkzExpander() = default;
  PkzExpander(const PkzExpander&) = delete;
  PkzExpander& operator=(const PkzExpander&) = delete;

  // False when there was no memory for the table; then the expander must not be used.
  bool IsReady() const { return table_ != nullptr; }

  // 0, or 1 for a bad stream: what comes behind the fault is ignored.
  int32_t failed() const { return failed_; }

  // Runs over one block of the code sequence.
  void Expand(const uint8_t* bytes, uint32_t count);

 protected:
  // Takes `count` bytes of output, which stay valid during the call alone: several whole strings of
  // at most 1024 bytes together, or one string. All strings of a block come before Expand returns;
  // once it has called Fail it is not called again.
  virtual void WriteOutput(const uint8_t* bytes, uint32_t count) = 0;

  void Fail() { failed_ = 1; }

 private:
  static constexpr uint32_t kWidenCode = 257;
  static constexpr uint32_t kResetCode = 258;
  static constexpr int32_t kFirstWidth = 9;
  static constexpr int32_t kLastWidth = 32;
  static constexpr uint32_t kBatchSize = 1024;

  enum class State { kFirstCode, kNextCode };  // the first one: at the start and after a reset

  // The next code, in `code`; false when the block has run out. A code split between blocks keeps
  // the width that it began with.
  bool ReadCode(uint32_t* code);

  // Acts on one code. False for a bad one, which adds nothing to the batch.
  bool TakeCode(uint32_t code);

  // Takes codes that stand for strings, as many as it can: the hot loop.
  void TakeStrings();

  // Hands the batch to WriteOutput and empties it.
  void GiveOut();

  int32_t failed_ = 0;
  int32_t bitsWanted_ = 0;          // that the present code still lacks; 0: no code begun
  uint32_t codeValue_ = 0;          // its bits so far
  int32_t bitsInByte_ = 0;          // unread bits of currentByte, 0 to 8; 0 between two blocks
  uint32_t currentByte_ = 0;        // with its used bits cleared
  const uint8_t* input_ = nullptr;  // next byte of the present block; not owned
  uint32_t inputLeft_ = 0;
  State state_ = State::kFirstCode;
  int32_t codeWidth_ = kFirstWidth;
  const std::unique_ptr<StringTable::Entry[]> table_;  // what strings_ works on
  StringTable strings_;
  // Strings not yet given out. All but the last together have at most kBatchSize bytes, so that
  // there always is room for one more.
  uint8_t batch_[kBatchSize + StringTable::kStringRoom];
  uint32_t batchFill_ = 0;
};

// An expander of whole streams, magic included, into a file.
class PkzFileExpander : public PkzExpander {
 public:
  // `output` is not owned.
  explicit PkzFileExpander(DataFile* output) : output_(output) {}

  // Expands one block. The first has to hold the magic whole and one byte more. A null block makes
  // the stream bad.
  void ExpandBlock(const uint8_t* bytes, uint32_t count);

  // Writes what is collected. The destructor doesn't.
  void Flush();
  uint32_t bufferFill() const { return bufferFill_; }

 protected:
  // Every write but the last has 1024 bytes: a full buffer waits for the byte behind it.
  void WriteOutput(const uint8_t* bytes, uint32_t count) override;

 private:
  static constexpr uint32_t kBufferSize = 1024;

  DataFile* output_;
  bool magicSeen_ = false;
  uint8_t buffer_[kBufferSize] = {};
  uint32_t bufferFill_ = 0;
};
