#include "desktop/windows/pages/pages_frame.h"

#include <wx/button.h>
#include <wx/checkbox.h>
#include <wx/dirdlg.h>
#include <wx/filedlg.h>
#include <wx/listbox.h>
#include <wx/msgdlg.h>
#include <wx/panel.h>
#include <wx/sizer.h>
#include <wx/splitter.h>
#include <wx/stattext.h>

#include <algorithm>
#include <cmath>

#include "batch/new_job.h"
#include "desktop/models/pages/page_work.h"
#include "desktop/models/shell/event_log.h"
#include "desktop/models/view/view_transform.h"
#include "desktop/windows/batch/batch_runner.h"
#include "desktop/windows/history/use_recorder.h"
#include "desktop/windows/pages/option_panel.h"
#include "desktop/windows/pages/page_canvas.h"
#include "desktop/windows/pages/page_printing.h"
#include "desktop/windows/shell/browser_tabs.h"
#include "desktop/windows/shell/shell.h"
#include "desktop/windows/widgets/looks.h"
#include "desktop/windows/widgets/screen_reader.h"
#include "desktop/windows/widgets/wx_text.h"
#include "platform/folders.h"
#include "platform/paths.h"
#include "printing/gallery_plan.h"
#include "settings/configuration.h"
#include "settings/settings.h"
#include "texts/status_text.h"

namespace fotomill::desktop {

namespace {

constexpr int kSideWidth = 340;
constexpr int kLineGap = 7;        // between the lines of a list
constexpr double kScreenDpi = 96;  // of a page in its real size

wxString TitleOf(size_t files) {
  return LabelCount("Print and pages: %1 picture", "Print and pages: %1 pictures", files);
}

wxStaticText* NewHeading(wxWindow* parent, const wxString& text) {
  auto* heading = new wxStaticText(parent, wxID_ANY, text);
  heading->SetFont(heading->GetFont().Bold());
  return heading;
}

}  // namespace

PagesFrame::PagesFrame(Shell& shell, const std::vector<std::string>& files, const char* kind)
    : wxFrame(&shell.Window(), wxID_ANY, TitleOf(files.size()), wxDefaultPosition, wxDefaultSize,
              wxDEFAULT_FRAME_STYLE, "FotomillProfessionalPages"),
      shell_(shell),
      files_(FilesOf(files)),
      order_(kind) {
  SetSize(shell.Window().GetSize());
  maker_ = std::make_unique<PagePreview>(files_, [this] { CallAfter([this] { PageCame(); }); });
  auto* panel = new wxPanel(this);
  auto* column = new wxBoxSizer(wxVERTICAL);
  auto* splitter = new wxSplitterWindow(panel, wxID_ANY, wxDefaultPosition, wxDefaultSize,
                                        wxSP_LIVE_UPDATE | wxSP_NOBORDER);
  splitter->SetMinimumPaneSize(FromDIP(220));
  splitter->SplitVertically(BuildSide(splitter), BuildPreview(splitter),
                            TextWidth(*this, FromDIP(kSideWidth)));
  column->Add(splitter, wxSizerFlags(1).Expand());
  column->Add(BuildButtons(panel), wxSizerFlags().Expand().Border(wxALL, FromDIP(8)));
  panel->SetSizer(column);
  CreateStatusBar();
  Bind(wxEVT_CHAR_HOOK, &PagesFrame::OnCharHook, this);
  Bind(wxEVT_CLOSE_WINDOW, [](wxCloseEvent& event) {
    (void)SaveConfiguration();
    LogEvent("pages", "closed");
    event.Skip();
  });
  ShowKind();
  kinds_->SetFocus();
}

PagesFrame::~PagesFrame() { maker_.reset(); }  // its thread calls back into this window

// --- building ---

wxWindow* PagesFrame::BuildSide(wxWindow* parent) {
  auto* panel = new wxPanel(parent);
  const int gap = FromDIP(8);
  auto* rows = new wxBoxSizer(wxVERTICAL);
  rows->Add(NewHeading(panel, Label("Kind of pages")));
  wxArrayString names;
  for (const PageKind* kind : PageKinds()) names.Add(Label(kind->label));
  kinds_ = new wxListBox(panel, wxID_ANY, wxDefaultPosition, wxDefaultSize, names);
  kinds_->SetName(Label("Kind of pages"));
  const int line = kinds_->GetCharHeight() + FromDIP(kLineGap);
  kinds_->SetMinSize(wxSize(-1, static_cast<int>(names.size()) * line + FromDIP(4)));
  kinds_->Bind(wxEVT_LISTBOX, [this](wxCommandEvent& event) {
    if (event.GetInt() < 0) return;
    order_.Choose(PageKinds()[static_cast<size_t>(event.GetInt())]->name);
    ShowKind();
  });
  rows->Add(kinds_, wxSizerFlags().Expand().Border(wxTOP, gap / 2));
  values_ = new OptionPanel(panel, order_, [this] { OrderChanged(); });
  rows->Add(values_, wxSizerFlags(1).Expand().Border(wxTOP, gap));
  auto* column = new wxBoxSizer(wxVERTICAL);
  column->Add(rows, wxSizerFlags(1).Expand().Border(wxLEFT | wxTOP | wxRIGHT, gap));
  panel->SetSizer(column);
  return panel;
}

wxWindow* PagesFrame::BuildPreview(wxWindow* parent) {
  auto* panel = new wxPanel(parent);
  auto* bar = new wxBoxSizer(wxHORIZONTAL);
  const auto apart = wxSizerFlags().CenterVertical().Border(wxRIGHT, FromDIP(4));
  const auto add = [&](const wxString& text, const wxString& name, const wxString& key,
                       std::function<void()> run) {
    auto* button =
        new wxButton(panel, wxID_ANY, text, wxDefaultPosition, wxDefaultSize, wxBU_EXACTFIT);
    button->SetName(name);
    button->SetToolTip(name + " (" + key + ")");
    button->Bind(wxEVT_BUTTON, [run = std::move(run)](wxCommandEvent&) { run(); });
    bar->Add(button, apart);
    return button;
  };
  first_ = add(L"|\u25C0", Label("First page"), "Ctrl+Home", [this] { GoTo(0); });
  previous_ = add(L"\u25C0", Label("Previous page"), "PageUp", [this] { StepPage(-1); });
  place_ = new wxStaticText(panel, wxID_ANY, "");
  place_->SetMinSize(wxSize(TextWidth(*this, FromDIP(130)), -1));
  place_->SetWindowStyle(wxALIGN_CENTER_HORIZONTAL | wxST_NO_AUTORESIZE);
  bar->Add(place_, apart);
  next_ = add(L"\u25B6", Label("Next page"), "PageDown", [this] { StepPage(1); });
  last_ = add(L"\u25B6|", Label("Last page"), "Ctrl+End", [this] { GoTo(SIZE_MAX); });
  bar->AddStretchSpacer();
  add(L"\u2212", Label("Zoom out"), "Ctrl+-",
      [this] { canvas_->ZoomBy(1 / ViewTransform::kStep); });
  add("+", Label("Zoom in"), "Ctrl++", [this] { canvas_->ZoomBy(ViewTransform::kStep); });
  add(Label("Fi&t"), Label("Whole page"), "Ctrl+0", [this] { canvas_->SetZoom(1); });
  canvas_ = new PageCanvas(panel, [this] { RequestPage(); });
  auto* rows = new wxBoxSizer(wxVERTICAL);
  rows->Add(bar, wxSizerFlags().Expand().Border(wxALL, FromDIP(6)));
  rows->Add(canvas_, wxSizerFlags(1).Expand());
  panel->SetSizer(rows);
  return panel;
}

wxSizer* PagesFrame::BuildButtons(wxWindow* parent) {
  auto* row = new wxBoxSizer(wxHORIZONTAL);
  preview_ = new wxCheckBox(parent, wxID_ANY, Label("Pre&view"));
  preview_->SetValue(settings.PhotoPrnPreview != 0);
  preview_->Bind(wxEVT_CHECKBOX, [this](wxCommandEvent&) { SetPreview(preview_->GetValue()); });
  row->Add(preview_, wxSizerFlags().CenterVertical());
  row->AddStretchSpacer();
  const auto add = [&](wxWindowID id, const wxString& text, std::function<void()> run) {
    auto* button = new wxButton(parent, id, text);
    button->Bind(wxEVT_BUTTON, [run = std::move(run)](wxCommandEvent&) { run(); });
    row->Add(button, wxSizerFlags().Border(wxLEFT, FromDIP(8)));
    return button;
  };
  setup_ = add(wxID_ANY, Label("Page set&up..."), [this] { AskPaper(); });
  add(wxID_CLOSE, "", [this] { Close(); });
  save_ = add(wxID_ANY, Label("&Save as PDF..."), [this] { Save(); });
  print_ = add(wxID_ANY, Label("&Print..."), [this] { Print(); });
  return row;
}

// --- the order ---

void PagesFrame::ShowKind() {
  const auto kinds = PageKinds();
  const auto place = std::ranges::find(kinds, &order_.Kind()) - kinds.begin();
  kinds_->SetSelection(static_cast<int>(place));
  values_->ShowKind();
  page_ = 0;
  LogEvent("pages", std::string("kind=") + order_.Kind().name);
  OrderChanged();
}

void PagesFrame::OrderChanged() {
  PagePlan plan;
  const std::string wrong = order_.Plan(plan);
  values_->ShowProblem(Shown(wrong));
  if (wrong.empty()) {
    ++orderNumber_;
    options_ = std::move(plan.run);
    RequestPage();
  }
  const bool onPaper = order_.Kind().onPaper;
  save_->SetLabel(onPaper ? Label("&Save as PDF...") : Label("&Build gallery..."));
  save_->GetContainingSizer()->Layout();
  save_->Enable(wrong.empty());
  print_->Enable(wrong.empty() && onPaper);
  setup_->Enable(onPaper);
}

bool PagesFrame::MakePlan(PagePlan& plan) {
  const std::string wrong = order_.Plan(plan);
  if (!wrong.empty()) wxMessageBox(Shown(wrong), GetTitle(), wxOK | wxICON_WARNING, this);
  return wrong.empty();
}

// --- preview ---

void PagesFrame::SetPreview(bool on) {
  settings.PhotoPrnPreview = on ? 1 : 0;
  if (on) canvas_->Show(nullptr);
  RequestPage();
}

void PagesFrame::RequestPage() {
  if (preview_ == nullptr || orderNumber_ == 0) return;  // not built yet
  waits_ = preview_->GetValue() && order_.Kind().onPaper;
  if (!order_.Kind().onPaper) {
    canvas_->ShowText(Label("A web gallery is a folder with pages for browsers."));
  } else if (waits_) {
    const wxSize pane = canvas_->PaneSize();
    maker_->Request({.order = orderNumber_,
                     .options = options_,
                     .page = page_,
                     .width = pane.x,
                     .height = pane.y,
                     .zoom = canvas_->Zoom()});
  } else {
    canvas_->ShowText(Label("The preview is off."));
  }
  UpdateControls();
}

void PagesFrame::PageCame() {
  const PageViewPointer view = maker_->Fetch();
  if (view == nullptr || !preview_->GetValue() || !order_.Kind().onPaper) return;
  waits_ = view->order != orderNumber_;
  std::string problems;
  for (const std::string& line : view->problems) problems += line + "; ";
  LogEvent("pages-preview", "order=" + std::to_string(view->order) + " page=" +
                                std::to_string(view->page + 1) + "/" + std::to_string(view->pages) +
                                " status=" + std::to_string(StatusNumber(view->status)) +
                                " size=" + std::to_string(std::lround(view->width)) + "x" +
                                std::to_string(std::lround(view->height)) +
                                " pixels=" + std::to_string(view->image.width) + "x" +
                                std::to_string(view->image.height) + " problems=" + problems);
  page_ = view->page;
  if (view->status != Status::Ok) {
    canvas_->ShowText(Shown(StatusText(view->status)));
  } else if (view->pages == 0) {
    canvas_->ShowText(Label("No picture can be put on a page."));
  } else {
    canvas_->Show(view);
  }
  wxString missing;
  for (const std::string& line : view->problems) missing += Shown(line) + "\n";
  if (view->leftOut > 0)
    missing +=
        LabelCount("%1 picture is on no page.", "%1 pictures are on no page.", view->leftOut);
  values_->ShowProblem(missing);
  UpdateControls();
}

void PagesFrame::GoTo(size_t page) {
  const PageViewPointer& view = canvas_->View();
  if (view == nullptr || view->pages == 0) return;
  const size_t wanted = std::min(page, view->pages - 1);
  if (wanted == page_) return;
  page_ = wanted;
  RequestPage();
}

void PagesFrame::StepPage(int by) {
  if (by > 0) return GoTo(page_ + 1);
  if (page_ > 0) GoTo(page_ - 1);
}

wxString PagesFrame::StatusLine() const {
  const PageViewPointer& view = canvas_->View();
  if (view == nullptr) return waits_ ? Label("Preview...") : wxString();
  wxString line = Label("%1 x %2 mm", std::lround(view->width), std::lround(view->height)) +
                  wxString::Format(", %ld%%", std::lround(100 * view->dpi / kScreenDpi));
  if (waits_) line += ", " + Label("preview...");
  return line;
}

void PagesFrame::UpdateControls() {
  if (print_ == nullptr || GetStatusBar() == nullptr) return;  // not built yet
  const PageViewPointer& view = canvas_->View();
  const size_t pages = view == nullptr ? 0 : view->pages;
  place_->SetLabel(pages == 0 ? wxString() : Label("Page %1 of %2", page_ + 1, pages));
  first_->Enable(page_ > 0 && pages > 0);
  previous_->Enable(page_ > 0 && pages > 0);
  next_->Enable(page_ + 1 < pages);
  last_->Enable(page_ + 1 < pages);
  const wxString line = StatusLine();
  if (GetStatusBar()->GetStatusText() != line) SetStatusText(line);
  ReportToScreenReader(*canvas_, Label("Preview"), place_->GetLabel() + " " + line);
}

// --- commands ---

void PagesFrame::AskPaper() {
  if (!AskPageSetup(*this, order_, printData_)) return;
  values_->ShowValues();
  OrderChanged();
}

void PagesFrame::Print() {
  PagePlan plan;
  if (!order_.Kind().onPaper) return wxBell();
  if (!MakePlan(plan)) return;
  if (!PrintOrder(*this, files_, order_, plan, printData_)) return;
  std::vector<std::string> names;
  for (const BatchFile& file : files_) names.push_back(platform::AbsolutePath(file.name));
  shell_.Uses().NoteAll(names, HistoryFunctionOf(order_.Kind()));
}

void PagesFrame::Save() { order_.Kind().onPaper ? SavePdf() : BuildGallery(); }

// An existing folder is taken if it has no pages of others.
void PagesFrame::BuildGallery() {
  wxDirDialog dialog(this, Label("Folder of the gallery"), "", wxDD_DEFAULT_STYLE);
  LogEvent("prompt", "gallery-folder");
  if (dialog.ShowModal() != wxID_OK) return;
  GalleryOptions gallery;
  std::string wrong = PlanGallery(order_.Values(), Utf8(dialog.GetPath()), gallery);
  if (wrong.empty()) {
    if (const std::string path = ForeignFile(gallery, files_.size()); !path.empty())
      wrong = Tr("\"%1\" already exists and does not belong to a gallery.", path);
  }
  if (!wrong.empty()) {
    LogEvent("prompt", "gallery-problem " + wrong);
    wxMessageBox(Shown(wrong), GetTitle(), wxOK | wxICON_WARNING, this);
    return;
  }
  shell_.Batches().Run(NewBatchJob(), [files = files_, gallery](BatchJob& job) {
    return WriteGallery(files, gallery, job);
  });
}

void PagesFrame::SavePdf() {
  PagePlan plan;
  if (!MakePlan(plan)) return;
  const wxString folder = Shown(platform::FolderOf(platform::AbsolutePath(files_.front().name)));
  wxFileDialog dialog(this, Label("Save as PDF"), folder, Label(order_.Kind().label) + ".pdf",
                      Label("PDF files") + " (*.pdf)|*.pdf", wxFD_SAVE | wxFD_OVERWRITE_PROMPT);
  LogEvent("prompt", "save-pdf");
  if (dialog.ShowModal() != wxID_OK) return;
  std::string path = Utf8(dialog.GetPath());
  if (platform::ExtensionOf(path).empty()) path += ".pdf";
  plan.run.title = platform::SplitPath(path).base;
  const FileFunction function = HistoryFunctionOf(order_.Kind());
  shell_.Batches().Run(NewBatchJob(), [files = files_, plan, function, path](BatchJob& job) {
    return WritePagesPdf(files, plan, function, path, job);
  });
}

// --- keys ---

bool PagesFrame::PageKey(int key, bool control) {
  const bool inCanvas = FindFocus() == canvas_;
  switch (key) {
    case WXK_PAGEDOWN: StepPage(1); return true;
    case WXK_PAGEUP: StepPage(-1); return true;
    case WXK_HOME:
    case WXK_END:
      if (!control && !inCanvas) return false;
      GoTo(key == WXK_HOME ? 0 : SIZE_MAX);
      return true;
    case '+':
    case '=':
    case WXK_NUMPAD_ADD: canvas_->ZoomBy(ViewTransform::kStep); return true;
    case '-':
    case WXK_NUMPAD_SUBTRACT: canvas_->ZoomBy(1 / ViewTransform::kStep); return true;
    case '0':
    case WXK_NUMPAD0: canvas_->SetZoom(1); return true;
    case 'P': return control ? (Print(), true) : false;
    case 'S': return control ? (Save(), true) : false;
    default: return false;
  }
}

void PagesFrame::OnCharHook(wxKeyEvent& event) {
  const int key = event.GetKeyCode();
  const wxWindow* const focus = FindFocus();
  const bool page = key == WXK_PAGEDOWN || key == WXK_PAGEUP;
  if (key == WXK_ESCAPE) {
    Close();
  } else if ((event.ControlDown() || page || focus == canvas_) && !event.AltDown() &&
             PageKey(key, event.ControlDown())) {
    return;
  } else if (key == WXK_TAB && focus == canvas_) {
    canvas_->Navigate(event.ShiftDown() ? wxNavigationKeyEvent::IsBackward
                                        : wxNavigationKeyEvent::IsForward);
  } else {
    event.Skip();
  }
}

void PrintSelection(Shell& shell, const char* kind) {
  const std::vector<std::string> files = shell.Tabs().SelectedFiles();
  if (!files.empty()) (new PagesFrame(shell, files, kind))->Show();
}

}  // namespace fotomill::desktop
