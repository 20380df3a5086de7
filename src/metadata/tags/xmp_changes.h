#pragma once

#include <vector>

#include "metadata/tags/tag_edit.h"
#include "metadata/xmp/xmp_tag_edit.h"
#include "metadata/xmp/xmp_tags.h"

namespace fotomill {

// The properties to write for changes to a picture with the tags `current`: those that differ from
// what the packet says. Copies that other programs keep in their own properties follow if they are
// there.
std::vector<XmpChange> XmpChangesFor(const XmpTags& xmp, const PictureTags& current,
                                     const TagChanges& changes);

}  // namespace fotomill
