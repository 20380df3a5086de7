#include "codec_bench.h"

static const bool registered = (fotomill::bench::RegisterCodec("pcx", {1, 4, 8, 24}), true);
