// Times decoders in one process: all files of a folder, the decoders in turn, the output counted in
// memory.
//
//   decode_bench FILES STREAMS ROUNDS   a line "DECODER SECONDS" for each decoder and round, after
//                                       every output has been compared with its file
//   decode_bench once DECODER STREAM    decodes one stream, inside the function DecodeOnce
//   decode_bench memory                 bytes of heap that one expander takes
//
// FILES and STREAMS are folders; the latter holds NAME.pkz, NAME.Z and NAME.gz for each file NAME.

#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <ctime>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <string>

#include "bench/decoders.h"

// With a plain name, so that a profiler can be told to count inside it alone.
extern "C" [[gnu::noinline]] bool DecodeOnce(const Decoder& decoder, Bytes stream, Output* output) {
  return decoder.decode(stream, output);
}

namespace {

namespace fs = std::filesystem;
using Content = std::vector<uint8_t>;

[[noreturn]] void Fail(const std::string& why) {
  std::fprintf(stderr, "decode_bench: %s\n", why.c_str());
  std::exit(1);
}

std::vector<Decoder> Decoders() {
  std::vector<Decoder> decoders = {{"expander", ".pkz", DecodeByExpander},
                                   {"plain", ".pkz", DecodePlainly}};
  for (const Decoder& peer : PeerDecoders()) decoders.push_back(peer);
  return decoders;
}

Content ReadFile(const fs::path& path) {
  std::ifstream file(path, std::ios::binary);
  Content content(std::istreambuf_iterator<char>(file), {});
  if (content.empty()) Fail("can't read " + path.string());
  return content;
}

std::vector<fs::path> FilesIn(const fs::path& folder) {
  std::vector<fs::path> files;
  for (const auto& entry : fs::directory_iterator(folder)) files.push_back(entry.path());
  if (files.empty()) Fail("no files in " + folder.string());
  std::sort(files.begin(), files.end());
  return files;
}

std::vector<Content> ReadStreams(const std::vector<fs::path>& files, const fs::path& folder,
                                 const char* extension) {
  std::vector<Content> streams;
  streams.reserve(files.size());
  for (const fs::path& file : files) {
    streams.push_back(ReadFile(folder / (file.filename().string() + extension)));
  }
  return streams;
}

void RequireSameOutput(const Decoder& decoder, const std::vector<fs::path>& files,
                       const std::vector<Content>& streams) {
  for (size_t i = 0; i < files.size(); ++i) {
    const Content content = ReadFile(files[i]);
    Output output(content);
    if (!decoder.decode(streams[i], &output) || output.differs()) {
      Fail(std::string(decoder.name) + " decodes " + files[i].string() + " wrongly");
    }
  }
}

// Processor time, which another program on the same CPU can't lengthen; on Windows clock() tells
// the time that has passed.
double SecondsFor(const Decoder& decoder, const std::vector<Content>& streams) {
  Output output;
  const std::clock_t start = std::clock();
  for (const Content& stream : streams) {
    if (!DecodeOnce(decoder, stream, &output)) Fail(decoder.name);
  }
  return static_cast<double>(std::clock() - start) / CLOCKS_PER_SEC;
}

void TimeAll(const fs::path& folder, const fs::path& streamFolder, int rounds) {
  const std::vector<fs::path> files = FilesIn(folder);
  const std::vector<Decoder> decoders = Decoders();
  std::vector<std::vector<Content>> streams;
  for (const Decoder& decoder : decoders) {
    streams.push_back(ReadStreams(files, streamFolder, decoder.extension));
    RequireSameOutput(decoder, files, streams.back());
  }
  for (int round = 0; round < rounds; ++round) {
    for (size_t i = 0; i < decoders.size(); ++i) {
      std::printf("%s %.6f\n", decoders[i].name, SecondsFor(decoders[i], streams[i]));
    }
  }
}

void DecodeOneStream(const std::string& name, const fs::path& path) {
  for (const Decoder& decoder : Decoders()) {
    if (name != decoder.name) continue;
    const Content stream = ReadFile(path);
    Output output;
    if (!DecodeOnce(decoder, stream, &output)) Fail(name);
    std::printf("%llu\n", static_cast<unsigned long long>(output.count()));
    return;
  }
  Fail("no decoder is called " + name);
}

}  // namespace

int main(int argc, char** argv) {
  const std::vector<std::string> arguments(argv + 1, argv + argc);
  if (arguments.size() == 1 && arguments[0] == "memory") {
    std::printf("%llu\n", static_cast<unsigned long long>(ExpanderMemory()));
  } else if (arguments.size() == 3 && arguments[0] == "once") {
    DecodeOneStream(arguments[1], arguments[2]);
  } else if (arguments.size() == 3) {
    TimeAll(arguments[0], arguments[1], std::atoi(arguments[2].c_str()));
  } else {
    Fail("FILES STREAMS ROUNDS, once DECODER STREAM, or memory");
  }
  return 0;
}
