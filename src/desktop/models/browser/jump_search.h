#pragma once

#include <string_view>
#include <vector>

#include "desktop/models/browser/folder_listing.h"

namespace fotomill::desktop {

class BrowserModel;

// How a name is searched for; ignoring case.
struct JumpRules {
  bool atStart = true;  // at the start of words; false: anywhere in the name
  bool phrase = false;  // the whole text; false: each of its words, in any order
};
// From JumpWindowSearchStart and JumpWindowSearchPhrase.
JumpRules JumpRulesFromSettings();

// Whether a name matches; an empty text matches every name. A word of a name begins after a
// character other than letters and digits, or where digits follow letters or letters digits.
bool JumpMatches(std::string_view name, std::string_view text, const JumpRules& rules);

// The shown items that match, in list order.
std::vector<FolderItem> JumpTargets(const BrowserModel& model, std::string_view text,
                                    const JumpRules& rules);

}  // namespace fotomill::desktop
