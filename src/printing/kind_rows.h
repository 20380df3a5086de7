#pragma once

#include "printing/page_kind.h"

namespace fotomill {

// The rows of the table of kinds, each beside the code for its options.
extern const PageKind kContactKind, kCatalogKind, kPhotoKind, kPrintKind, kPosterKind, kCubeKind,
    kDodecahedronKind, kGalleryKind;

}  // namespace fotomill
