#include "support/codec_target.h"

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  fotomill::fuzz::TryCodec("ani", data, size);
  return 0;
}
