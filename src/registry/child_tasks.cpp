#include "registry/child_tasks.h"

#include "formats/hdphoto/hdp_codec.h"

namespace fotomill {

namespace {

constexpr platform::ApartTask kChildTasks[] = {
    {kHdpTask, DecodeHdpApart},
};

}  // namespace

std::span<const platform::ApartTask> ChildTasks() { return kChildTasks; }

}  // namespace fotomill
