#pragma once

#include <wx/checklst.h>

#include <cstdint>

namespace fotomill::desktop {

// Shows a number as a check list with a name for each bit. Other bits are preserved.
class MaskList : public wxCheckListBox {
 public:
  MaskList(wxWindow* parent, wxWindowID id, const wxArrayString& names)
      : wxCheckListBox(parent, id, wxDefaultPosition, wxDefaultSize, names) {}

  // Checks the names of the set bits; Mask returns the number as currently checked.
  void SetMask(int32_t mask) {
    mask_ = mask;
    for (unsigned bit = 0; bit < GetCount(); ++bit) Check(bit, (mask >> bit & 1) != 0);
  }
  int32_t Mask() const {
    uint32_t mask = static_cast<uint32_t>(mask_);
    for (unsigned bit = 0; bit < GetCount(); ++bit)
      mask = IsChecked(bit) ? mask | 1u << bit : mask & ~(1u << bit);
    return static_cast<int32_t>(mask);
  }

 private:
  int32_t mask_ = 0;
};

}  // namespace fotomill::desktop
