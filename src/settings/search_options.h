#pragma once

#include "catalog/search/picture_facts.h"
#include "catalog/search/search_criteria.h"
#include "catalog/similar/similar_search.h"

namespace fotomill {

// The settings that the facts of a search depend on.
FactsOptions FactsOptionsFromSettings();

// The last search: PictureSearchMode (0: all criteria, 1: any), PictureSearchWildcardField and,
// each if its Match key is on, PictureSearchCommentField, PictureSearchKeywordField (separated by
// commas), PictureSearchMatchField and faces.
SearchCriteria SearchCriteriaFromSettings();

// FindSimlarDistance, clamped to its range, and FindSimilarTransforms.
SimilarOptions SimilarOptionsFromSettings();

}  // namespace fotomill
