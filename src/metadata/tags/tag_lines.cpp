#include "metadata/tags/tag_lines.h"

#include <algorithm>

#include "core/text.h"

namespace fotomill {

namespace {

std::string Listed(std::initializer_list<std::string_view> parts) {
  std::string text;
  for (const std::string_view part : parts) {
    if (!part.empty()) text.append(text.empty() ? "" : ", ").append(part);
  }
  return text;
}

// The usual colors are translated; other programs' own words are shown as they are.
std::string ShownLabel(const std::string& label) {
  constexpr const char* kShown[] = {TrLater("Red"), TrLater("Yellow"), TrLater("Green"),
                                    TrLater("Blue"), TrLater("Purple")};
  static_assert(std::size(kShown) == std::size(kLabelNames));
  for (const char* shown : kShown) {
    if (EqualIgnoringCase(shown, label)) return Tr(shown);
  }
  return label;
}

}  // namespace

std::string KeywordText(const PictureTags& tags) {
  std::string text;
  for (const std::string& keyword : tags.keywords)
    text.append(text.empty() ? "" : ", ").append(keyword);
  return text;
}

std::vector<std::string> ListedKeywords(std::string_view text) {
  std::vector<std::string> keywords;
  for (bool more = true; more;) {
    const size_t comma = text.find(',');
    std::string_view word = text.substr(0, comma);
    word.remove_prefix(std::min(word.find_first_not_of(" \t\r\n"), word.size()));
    word = word.substr(0, word.find_last_not_of(" \t\r\n") + 1);
    if (!word.empty()) keywords.emplace_back(word);
    more = comma != std::string_view::npos;
    text.remove_prefix(more ? comma + 1 : text.size());
  }
  return keywords;
}

std::string PlaceText(const PictureTags& tags) {
  const std::string_view code = tags.country.empty() ? std::string_view(tags.countryCode) : "";
  return Listed({tags.sublocation, tags.city, tags.state, tags.country, code});
}

std::vector<TagLine> TagLines(const PictureTags& tags) {
  std::vector<TagLine> lines;
  const auto add = [&](const char* label, std::string text) {
    if (!text.empty()) lines.push_back({label, std::move(text)});
  };
  add(TrLater("Title"), tags.title);
  add(TrLater("Description"), tags.description);
  add(TrLater("Comment"), tags.comment);
  add(TrLater("Keywords"), KeywordText(tags));
  if (tags.rating != 0)
    add(TrLater("Rating"), tags.rating < 0 ? Tr("rejected") : std::to_string(tags.rating));
  add(TrLater("Label"), ShownLabel(tags.label));
  add(TrLater("Creator"), tags.creator);
  add(TrLater("Copyright"), tags.copyright);
  add(TrLater("Place name"), PlaceText(tags));
  return lines;
}

}  // namespace fotomill
