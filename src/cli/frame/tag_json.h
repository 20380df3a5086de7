#pragma once

#include "cli/frame/result_output.h"
#include "metadata/tags/picture_tags.h"

namespace fotomill::cli {

// The tags of a picture as an object, without empty ones: {title, description, comment, keywords,
// rating, label, creator, copyright, place: {sublocation, city, state, country, countryCode}}.
Json TagsAsJson(const PictureTags& tags);

}  // namespace fotomill::cli
