// The Windows builds have no other makers' libraries.
#include "bench/decoders.h"

std::vector<Decoder> PeerDecoders() {
  return {};
}
