#include "cli/frame/tag_json.h"

namespace fotomill::cli {

Json TagsAsJson(const PictureTags& tags) {
  Json object = Json::object(), place = Json::object();
  const auto put = [](Json& into, const char* key, const std::string& text) {
    if (!text.empty()) PutName(into, key, text);
  };
  put(object, "title", tags.title);
  put(object, "description", tags.description);
  put(object, "comment", tags.comment);
  for (const std::string& keyword : tags.keywords) {
    Json item;
    PutName(item, "keyword", keyword);
    object["keywords"].push_back(item["keyword"]);
  }
  if (tags.rating != 0) object["rating"] = tags.rating;
  put(object, "label", tags.label);
  put(object, "creator", tags.creator);
  put(object, "copyright", tags.copyright);
  put(place, "sublocation", tags.sublocation);
  put(place, "city", tags.city);
  put(place, "state", tags.state);
  put(place, "country", tags.country);
  put(place, "countryCode", tags.countryCode);
  if (!place.empty()) object["place"] = std::move(place);
  return object;
}

}  // namespace fotomill::cli
