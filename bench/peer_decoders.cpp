// Other makers' decoders, each with the streams of its own format.
#include <archive.h>
#include <zlib.h>

#include <algorithm>
#include <array>

#include "bench/decoders.h"

namespace {

bool DecodeByArchive(Bytes stream, Output* output) {
  archive* reader = archive_read_new();
  archive_entry* entry = nullptr;
  bool good = archive_read_support_filter_compress(reader) == ARCHIVE_OK &&
              archive_read_support_format_raw(reader) == ARCHIVE_OK &&
              archive_read_open_memory(reader, stream.data(), stream.size()) == ARCHIVE_OK &&
              archive_read_next_header(reader, &entry) == ARCHIVE_OK;
  int status = ARCHIVE_OK;
  while (good && status == ARCHIVE_OK) {
    const void* block = nullptr;
    size_t count = 0;
    la_int64_t offset = 0;
    status = archive_read_data_block(reader, &block, &count, &offset);
    if (status == ARCHIVE_OK) output->Take(block, count);
  }
  good = good && status == ARCHIVE_EOF;
  archive_read_free(reader);
  return good;
}

// Input and output go through buffers of 64 KB.
bool DecodeByInflate(Bytes stream, Output* output) {
  constexpr int kGzipWindow = 15 + 16;  // the largest window, behind a gzip header
  static std::array<uint8_t, 65536> input;
  static std::array<uint8_t, 65536> buffer;
  z_stream state = {};
  if (inflateInit2(&state, kGzipWindow) != Z_OK) return false;
  int status = Z_OK;
  while (status == Z_OK) {
    if (state.avail_in == 0) {
      const size_t count = std::min(stream.size(), input.size());
      std::copy_n(stream.begin(), count, input.begin());
      stream = stream.subspan(count);
      state.next_in = input.data();
      state.avail_in = static_cast<uInt>(count);
    }
    state.next_out = buffer.data();
    state.avail_out = static_cast<uInt>(buffer.size());
    status = inflate(&state, Z_NO_FLUSH);
    output->Take(buffer.data(), buffer.size() - state.avail_out);
  }
  inflateEnd(&state);
  return status == Z_STREAM_END;
}

}  // namespace

std::vector<Decoder> PeerDecoders() {
  return {{"libarchive", ".Z", DecodeByArchive}, {"zlib", ".gz", DecodeByInflate}};
}
