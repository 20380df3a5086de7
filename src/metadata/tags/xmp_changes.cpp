#include "metadata/tags/xmp_changes.h"

#include <algorithm>
#include <utility>

#include "metadata/tags/tag_words.h"
#include "metadata/xmp/xmp_names.h"

namespace fotomill {

namespace {

bool Contains(const std::vector<std::string>& texts, std::string_view text) {
  return std::ranges::find(texts, text) != texts.end();
}

class Builder {
 public:
  Builder(const XmpTags& xmp, const PictureTags& current, const TagChanges& changes)
      : xmp_(xmp), current_(current), changes_(changes) {}

  std::vector<XmpChange> Build() {
    if (changes_.keywords || !changes_.addedKeywords.empty() || !changes_.removedKeywords.empty())
      Keywords();
    if (changes_.rating) Rating(*changes_.rating);
    if (changes_.label) Label(*changes_.label);
    if (changes_.description)
      Text({xmp::kDublinCore, "dc", "description", XmpForm::Languages}, xmp_.description,
           *changes_.description);
    return std::move(made_);
  }

 private:
  // An empty text removes the property.
  void Text(XmpChange change, const std::string& old, const std::string& text) {
    if (old == text) return;
    if (!text.empty()) change.values = {text};
    made_.push_back(std::move(change));
  }
  void List(XmpChange change, const std::vector<std::string>& old,
            std::vector<std::string> values) {
    if (old == values) return;
    change.values = std::move(values);
    made_.push_back(std::move(change));
  }

  void Keywords() {
    const std::vector<std::string> keywords = ChangedKeywords(current_.keywords, changes_);
    List({xmp::kDublinCore, "dc", "subject", XmpForm::Bag}, xmp_.keywords, keywords);
    Copy({xmp::kDigiKam, "digiKam", "TagsList", XmpForm::Seq, {}, false}, xmp_.digiKamTags, '/',
         keywords);
    Copy({xmp::kLightroom, "lr", "hierarchicalSubject", XmpForm::Bag, {}, false},
         xmp_.lightroomTags, '|', keywords);
    for (const std::string_view uri : {xmp::kMicrosoft, xmp::kMicrosoftOld})
      Copy({uri, "MicrosoftPhoto", "LastKeywordXMP", XmpForm::Bag, {}, false}, xmp_.microsoftTags,
           '/', keywords);
  }
  // A list with the same keywords and their parents.
  void Copy(XmpChange change, const std::vector<std::string>& old, char separator,
            const std::vector<std::string>& keywords) {
    if (old.empty()) return;
    std::vector<std::string> list = old;
    std::erase_if(list, [&](const std::string& tag) {
      const std::string_view leaf = LeafOf(tag, separator);
      const bool asked = changes_.keywords || Contains(changes_.removedKeywords, leaf);
      return asked && !Contains(keywords, leaf);
    });
    for (const std::string& keyword : keywords) {
      const bool asked = changes_.keywords || Contains(changes_.addedKeywords, keyword);
      const auto is = [&](const std::string& tag) { return LeafOf(tag, separator) == keyword; };
      if (asked && std::ranges::none_of(list, is)) list.push_back(keyword);
    }
    List(std::move(change), old, std::move(list));
  }

  void Rating(int32_t rating) {
    const bool none = xmp_.rating.empty() && current_.rating == 0;
    if (rating != 0 || !none)
      Text({xmp::kBasic, "xmp", "Rating"}, xmp_.rating, std::to_string(rating));
    if (xmp_.microsoftRating.empty()) return;
    for (const std::string_view uri : {xmp::kMicrosoft, xmp::kMicrosoftOld})
      Text({uri, "MicrosoftPhoto", "Rating", XmpForm::Text, {}, false}, xmp_.microsoftRating,
           std::to_string(MicrosoftRating(rating)));
  }

  void Label(const std::string& label) {
    Text({xmp::kBasic, "xmp", "Label"}, xmp_.label, label);
    if (xmp_.digiKamLabel.empty()) return;
    Text({xmp::kDigiKam, "digiKam", "ColorLabel", XmpForm::Text, {}, false}, xmp_.digiKamLabel,
         std::to_string(std::max(DigiKamLabel(label), 0)));
  }

  const XmpTags& xmp_;
  const PictureTags& current_;
  const TagChanges& changes_;
  std::vector<XmpChange> made_;
};

}  // namespace

std::vector<XmpChange> XmpChangesFor(const XmpTags& xmp, const PictureTags& current,
                                     const TagChanges& changes) {
  return Builder(xmp, current, changes).Build();
}

}  // namespace fotomill
