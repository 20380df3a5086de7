#include "codec_bench.h"

static const bool registered = (fotomill::bench::RegisterCodec("xbm", {1}), true);
