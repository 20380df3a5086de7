// IPTC data and the resources around them: what is written can be read and says what was asked for.

#include <algorithm>
#include <cstdlib>
#include <vector>

#include "containers/photoshop_resources.h"
#include "metadata/iptc/iptc_records.h"

namespace {

using namespace fotomill;

void Expect(bool holds) {
  if (!holds) std::abort();
}

void Edit(std::span<const uint8_t> data, const IptcChanges& changes) {
  std::vector<uint8_t> made, again;
  if (EditIptc(data, changes, made) != Status::Ok) return;
  const IptcTags before = ReadIptcTags(data), after = ReadIptcTags(made);
  if (changes.keywords) Expect(after.keywords == *changes.keywords);
  if (changes.description) Expect(after.description == *changes.description);
  Expect(after.title == before.title && after.city == before.city);
  if (made.empty()) return;
  Expect(EditIptc(made, changes, again) == Status::Ok && again == made);
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  const std::vector<uint8_t> bytes(data, data + size);
  Edit(bytes, {std::vector<std::string>{"one", "zw\xC3\xB6lf"}, "x"});
  Edit(bytes, {std::vector<std::string>{}, std::nullopt});
  std::vector<uint8_t> blanked = bytes;
  (void)BlankIptcPlaces(blanked);
  const std::vector<uint8_t> other = {1, 2, 3};
  const NewResource item{kIptcResource, other};
  const auto old = FindPhotoshopResource(bytes, kIptcResource);
  const std::vector<uint8_t> made = ReplacePhotoshopResources(bytes, {&item, 1});
  Expect(old.empty() ? true
                     : std::ranges::equal(FindPhotoshopResource(made, kIptcResource), other));
  return 0;
}
