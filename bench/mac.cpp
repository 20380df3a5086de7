#include "codec_bench.h"

static const bool registered = (fotomill::bench::RegisterCodec("mac", {1}, {576, 720}), true);
