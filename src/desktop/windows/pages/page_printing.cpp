#include "desktop/windows/pages/page_printing.h"

#include <wx/dc.h>
#include <wx/image.h>
#include <wx/msgdlg.h>
#include <wx/paper.h>
#include <wx/print.h>
#include <wx/printdlg.h>
#include <wx/progdlg.h>

#include <algorithm>
#include <atomic>
#include <cmath>
#include <cstring>

#include "core/workers/guarded.h"
#include "desktop/models/drawing/rgb_image.h"
#include "desktop/models/pages/page_work.h"
#include "desktop/models/shell/event_log.h"
#include "desktop/windows/widgets/wx_text.h"
#include "printing/page_failure.h"
#include "settings/settings.h"
#include "texts/status_text.h"

namespace fotomill::desktop {

namespace {

constexpr double kMostDpi = 300;
constexpr size_t kMostProblems = 12;  // shown in a message

// Draws pages on the printer at its resolution; pictures are read meanwhile, and the progress box
// keeps the windows alive.
class OrderPrintout : public wxPrintout {
 public:
  OrderPrintout(wxWindow& parent, const std::vector<BatchFile>& files, const PagePlan& plan,
                const wxString& title)
      : wxPrintout(title),
        parent_(parent),
        run_(files, plan.run,
             {.progress = {},
              .goesOn = [this] { return !aborted_; },
              .tick = [this] { ShowProgress(); }}) {}

  void OnPreparePrinting() override {
    progress_ = std::make_unique<wxProgressDialog>(Label("Printing"),
                                                   Label("Reading the pictures..."), 1000, &parent_,
                                                   wxPD_APP_MODAL | wxPD_CAN_ABORT | wxPD_SMOOTH);
    LogEvent("pages-printing", "begun");
    ended_ = Guarded([this] { return run_.Open() ? Status::Ok : Status::FunctionCancelled; });
  }
  void OnEndPrinting() override {
    progress_.reset();
    wxPrintout::OnEndPrinting();
  }
  void GetPageInfo(int* least, int* most, int* from, int* to) override {
    const auto pages = std::max(1, static_cast<int>(run_.Pages().size()));
    *least = *from = 1;
    *most = *to = pages;
  }
  bool HasPage(int page) override {
    return ended_ == Status::Ok && page >= 1 && page <= static_cast<int>(run_.Pages().size());
  }
  bool OnPrintPage(int page) override {
    if (!HasPage(page)) return false;
    place_ = static_cast<size_t>(page) - 1;
    ShowProgress();
    ended_ = Guarded([this] { return Draw(run_.Pages()[place_]); });
    if (ended_ == Status::Ok) ++printed_;
    return ended_ == Status::Ok;
  }

  Status Ended() const { return aborted_ ? Status::FunctionCancelled : ended_; }
  size_t Printed() const { return printed_; }
  std::span<const PageOutcome> Outcomes() const { return run_.Outcomes(); }

 private:
  Status Draw(const Page& page) {
    int across = 0, down = 0;
    GetPPIPrinter(&across, &down);
    PackedImage packed;
    RETURN_IF_BAD(run_.DrawPage(place_, std::clamp<double>(across, 72, kMostDpi), packed));
    RgbImage rgb;
    RETURN_IF_BAD(ToRgb(packed, rgb));
    wxImage image(rgb.width, rgb.height, false);
    std::memcpy(image.GetData(), rgb.bytes.data(), rgb.bytes.size());
    const wxRect paper = GetPaperRectPixels();
    // A page lies on upright paper, and the other way around.
    double width = page.width;
    if ((page.width > page.height) != (paper.width > paper.height) && page.width != page.height) {
      image = image.Rotate90();
      width = page.height;
    }
    wxDC& dc = *GetDC();
    const double scale = width / kMmPerInch * across / image.GetWidth();
    dc.SetUserScale(scale, scale);
    dc.DrawBitmap(wxBitmap(image), static_cast<int>(std::lround(paper.x / scale)),
                  static_cast<int>(std::lround(paper.y / scale)));
    return Status::Ok;
  }

  void ShowProgress() {
    if (progress_ == nullptr || showing_) return;
    showing_ = true;  // updates handle events
    const size_t pages = run_.Pages().size();
    const bool goesOn = pages == 0 ? progress_->Pulse()
                                   : progress_->Update(static_cast<int>(999 * place_ / pages),
                                                       Label("Page %1 of %2", place_ + 1, pages));
    if (!goesOn) aborted_ = true;
    showing_ = false;
  }

  wxWindow& parent_;
  std::atomic<bool> aborted_{false};
  PageRun run_;
  std::unique_ptr<wxProgressDialog> progress_;
  Status ended_ = Status::Ok;
  size_t place_ = 0, printed_ = 0;
  bool showing_ = false;
};

void ReportProblems(wxWindow& parent, const std::vector<BatchFile>& files,
                    const OrderPrintout& printout) {
  std::vector<std::string> lines = ProblemLines(files, printout.Outcomes());
  const Status status = printout.Ended();
  wxString text;
  if (status != Status::Ok && status != Status::FunctionCancelled)
    text = Shown(StatusText(status) + " " + PageFailureHint(status, {})) + "\n\n";
  if (!lines.empty())
    text += LabelCount(
        "%1 picture could not be printed:", "%1 pictures could not be printed:", lines.size());
  if (lines.size() > kMostProblems) {
    lines.resize(kMostProblems);
    lines.emplace_back("...");
  }
  for (const std::string& line : lines) text += "\n" + Shown(line);
  if (text.empty()) return;
  LogEvent("prompt", "print-problems " + Utf8(text).substr(0, 200));
  wxMessageBox(text, Label("Print"), wxOK | wxICON_WARNING, &parent);
}

wxSize TenthsOf(const PaperSize& size) {
  return {static_cast<int>(std::lround(size.width * 10)),
          static_cast<int>(std::lround(size.height * 10))};
}

}  // namespace

void FillPrintData(const PageOrder& order, wxPrintData& data) {
  const PaperSize paper = order.Paper();
  const bool wide = paper.width > paper.height;
  data.SetOrientation(wide ? wxLANDSCAPE : wxPORTRAIT);
  const wxSize size = TenthsOf(wide ? paper.Turned() : paper);
  data.SetPaperId(wxThePrintPaperDatabase->GetSize(size));
  data.SetPaperSize(wxSize(size.x / 10, size.y / 10));
  const std::string printer(settings.DefaultPrinterName.view());
  if (!printer.empty()) data.SetPrinterName(Shown(printer));
}

bool AskPageSetup(wxWindow& parent, PageOrder& order, wxPrintData& data) {
  FillPrintData(order, data);
  wxPageSetupDialogData setup(data);
  const PaperSize old = order.Paper();
  setup.SetPaperSize(TenthsOf(old) / 10);
  setup.EnableMargins(false);
  wxPageSetupDialog dialog(&parent, &setup);
  LogEvent("prompt", "page-setup");
  if (dialog.ShowModal() != wxID_OK) return false;
  data = dialog.GetPageSetupData().GetPrintData();
  // The dialog names papers, whose exact sizes are in the toolkit's table.
  const wxSize tenths = wxThePrintPaperDatabase->GetSize(data.GetPaperId());
  PaperSize size{tenths.x / 10.0, tenths.y / 10.0};
  if (tenths.x <= 0 || tenths.y <= 0) size = old.width > old.height ? old.Turned() : old;
  return order.SetPaper(data.GetOrientation() == wxLANDSCAPE ? size.Turned() : size);
}

bool PrintOrder(wxWindow& parent, const std::vector<BatchFile>& files, const PageOrder& order,
                const PagePlan& plan, wxPrintData& data) {
  FillPrintData(order, data);
  wxPrintDialogData choice(data);
  choice.SetAllPages(true);  // newer releases of the toolkit would choose the first page
  wxPrinter printer(&choice);
  OrderPrintout printout(parent, files, plan, Label(order.Kind().label));
  LogEvent("prompt", "print");
  const bool done = printer.Print(&parent, &printout, true);
  data = printer.GetPrintDialogData().GetPrintData();
  if (done) settings.DefaultPrinterName.AssignCut(Utf8(data.GetPrinterName()));
  LogEvent("pages-printed", "pages=" + std::to_string(printout.Printed()) +
                                " status=" + std::to_string(StatusNumber(printout.Ended())) +
                                " done=" + std::to_string(done));
  if (done || printout.Ended() != Status::Ok) ReportProblems(parent, files, printout);
  return printout.Printed() > 0;
}

}  // namespace fotomill::desktop
