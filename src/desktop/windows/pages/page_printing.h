#pragma once

#include <wx/cmndata.h>

#include <memory>
#include <string>
#include <vector>

#include "desktop/models/pages/page_order.h"

class wxWindow;

namespace fotomill::desktop {

// The printer with the printer and the paper of an order set in `data`.
void FillPrintData(const PageOrder& order, wxPrintData& data);

// Shows the system's dialog for paper and orientation. True if the order was changed.
bool AskPageSetup(wxWindow& parent, PageOrder& order, wxPrintData& data);

// Shows the system's print dialog and prints the pages, with a progress box that can abort. Tells
// which pictures are missing. True if something was printed. The printer is remembered in
// DefaultPrinterName.
bool PrintOrder(wxWindow& parent, const std::vector<BatchFile>& files, const PageOrder& order,
                const PagePlan& plan, wxPrintData& data);

}  // namespace fotomill::desktop
