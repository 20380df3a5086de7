#pragma once

#include <wx/treectrl.h>

#include <functional>

#include "operations/operations.h"

namespace fotomill::desktop {

// The operations, by families.
class OperationTree : public wxTreeCtrl {
 public:
  // With `chosen` selected, if it is not null. `activated` is called on Enter and double clicks.
  OperationTree(wxWindow* parent, const Operation* chosen, std::function<void()> activated);

  // The selected operation; null if there is none, or if it is a family, which is then opened or
  // closed.
  const Operation* TakeChosen();
};

// The name of a family in windows; translated when it is shown.
const char* FamilyLabel(Family family);

}  // namespace fotomill::desktop
