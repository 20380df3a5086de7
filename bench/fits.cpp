#include "codec_bench.h"

static const bool registered = (fotomill::bench::RegisterCodec("fits", {1, 8, 24}), true);
