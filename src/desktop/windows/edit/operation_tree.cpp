#include "desktop/windows/edit/operation_tree.h"

#include <map>
#include <utility>

#include "desktop/windows/widgets/wx_text.h"

namespace fotomill::desktop {

namespace {

// In the order of Family.
constexpr const char* kFamilies[] = {TrLater("Crop"),   TrLater("Transform"), TrLater("Effects"),
                                     TrLater("Filter"), TrLater("Annotate"),  TrLater("Watermark"),
                                     TrLater("Matt")};

// The operation of a row of the tree.
class OperationItem : public wxTreeItemData {
 public:
  explicit OperationItem(const Operation& row) : operation(row) {}
  const Operation& operation;
};

}  // namespace

const char* FamilyLabel(Family family) { return kFamilies[static_cast<int>(family)]; }

OperationTree::OperationTree(wxWindow* parent, const Operation* chosen,
                             std::function<void()> activated)
    : wxTreeCtrl(parent, wxID_ANY, wxDefaultPosition, wxDefaultSize,
                 wxTR_HIDE_ROOT | wxTR_HAS_BUTTONS | wxTR_SINGLE | wxTR_NO_LINES) {
  SetName(Label("Operations"));
  SetToolTip(Label("Enter or a double click adds a step."));
  const wxTreeItemId root = AddRoot("");
  std::map<Family, wxTreeItemId> families;
  for (const Operation* operation : Operations()) {
    wxTreeItemId& family = families[operation->family];
    if (!family.IsOk()) family = AppendItem(root, Label(FamilyLabel(operation->family)));
    const wxTreeItemId item =
        AppendItem(family, Label(operation->label), -1, -1, new OperationItem(*operation));
    if (operation == chosen) {
      Expand(family);
      SelectItem(item);
      // The size is not known yet.
      CallAfter([this, family, item] {
        EnsureVisible(family);
        EnsureVisible(item);
      });
    }
  }
  Bind(wxEVT_TREE_ITEM_ACTIVATED,
       [activated = std::move(activated)](wxTreeEvent&) { activated(); });
}

const Operation* OperationTree::TakeChosen() {
  const wxTreeItemId item = GetSelection();
  if (!item.IsOk()) return nullptr;
  const auto* data = dynamic_cast<OperationItem*>(GetItemData(item));
  if (data != nullptr) return &data->operation;
  Toggle(item);
  return nullptr;
}

}  // namespace fotomill::desktop
