#include "desktop/windows/view/view_commands.h"

#include <wx/defs.h>

#include "desktop/windows/view/view_frame.h"

namespace fotomill::desktop {

namespace {

template <int step>
void Step(ViewFrame& view) {
  view.Step(step);
}
template <int step>
void StepPage(ViewFrame& view) {
  view.StepPage(step);
}
template <int step>
void StepFrame(ViewFrame& view) {
  view.StepFrame(step);
}
template <ZoomMode mode>
void Zoom(ViewFrame& view) {
  view.Canvas().SetZoom(mode);
}
template <Orientation turn>
void Turn(ViewFrame& view) {
  view.Turn(turn);
}
template <void (ViewFrame::*action)()>
void Of(ViewFrame& view) {
  (view.*action)();
}
template <void (ViewCanvas::*action)()>
void OfCanvas(ViewFrame& view) {
  (view.Canvas().*action)();
}
template <int32_t Settings::*setting>
constexpr auto Switch = SwitchSetting<ViewFrame, setting>;
template <int32_t Settings::*setting>
constexpr auto IsOn = SettingIsOn<ViewFrame, setting>;
void First(ViewFrame& view) { view.GoTo(0); }
void Last(ViewFrame& view) { view.GoTo(view.LastPlace()); }

// clang-format off
constexpr KeyCommand<ViewFrame> kCommands[] = {
    {"&Next",             "Page Down", {WXK_PAGEDOWN, 'N'},             Step<1>},
    {"&Previous",         "Backspace", {WXK_BACK, WXK_PAGEUP, 'P'},     Step<-1>},
    {"&First",            "Home",      {WXK_HOME},                      First},
    {"&Last",             "End",       {WXK_END},                       Last},
    {nullptr, nullptr, {}, nullptr},
    {"Zoom &in",          "+",         {'+', '=', WXK_NUMPAD_ADD},      OfCanvas<&ViewCanvas::ZoomIn>},
    {"Zoom &out",         "-",         {'-', WXK_NUMPAD_SUBTRACT},      OfCanvas<&ViewCanvas::ZoomOut>},
    {"Fit to &window",    "0",         {'0', WXK_NUMPAD0},              Zoom<ZoomMode::Fit>},
    {"&Actual size",      "1",         {'1', WXK_NUMPAD1},              OfCanvas<&ViewCanvas::ZoomActual>},
    {"Fit to wi&dth",     "2",         {'2', WXK_NUMPAD2},              Zoom<ZoomMode::FitWidth>},
    {"Fi&ll the window",  "3",         {'3', WXK_NUMPAD3},              Zoom<ZoomMode::Fill>},
    {"&Keep zoom and place between pictures", "K", {'K'},               Switch<&Settings::ViewModeKeepZoom>, IsOn<&Settings::ViewModeKeepZoom>},
    {nullptr, nullptr, {}, nullptr},
    {"Play, pause or ne&xt", "Space",  {WXK_SPACE},                     Of<&ViewFrame::PlayOrNext>},
    {"Next frame",        ".",         {'.'},                           StepFrame<1>},
    {"Previous frame",    ",",         {','},                           StepFrame<-1>},
    {"Next pa&ge",        "]",         {']'},                           StepPage<1>},
    {"Pre&vious page",    "[",         {'['},                           StepPage<-1>},
    {nullptr, nullptr, {}, nullptr},
    {"Full &screen",      "F11",       {WXK_F11, 'F'},                  Of<&ViewFrame::ToggleFullScreen>},
    {"Slides&how",        "S",         {'S', WXK_F8},                   Of<&ViewFrame::ToggleSlideshow>},
    {"Slidesho&w...",     "Shift+S",   {},                              Of<&ViewFrame::ChooseSlideshow>},
    {"In&formation",      "I",         {'I'},                           Of<&ViewFrame::ToggleOverlay>},
    {"Colors of the pro&file", "M",    {'M'},                           Switch<&Settings::ViewModeColorProfiles>, IsOn<&Settings::ViewModeColorProfiles>},
    {"Check&erboard behind transparency", "B", {'B'},                   Switch<&Settings::ViewModeCheckerboard>, IsOn<&Settings::ViewModeCheckerboard>},
    {"G&et info...",      "Alt+Enter", {},                              Of<&ViewFrame::ShowInfoWindow>},
    {nullptr, nullptr, {}, nullptr},
    {"Rotate &left",      "L",         {'L'},                           Turn<Orientation::QuarterLeft>},
    {"Rotate &right",     "R",         {'R'},                           Turn<Orientation::QuarterRight>},
    {"Flip left and right", "H",       {'H'},                           Turn<Orientation::MirrorAcross>},
    {"Flip top and bottom", "V",       {'V'},                           Turn<Orientation::MirrorDown>},
    {"Sa&ve the turned picture", "Ctrl+S", {WXK_CONTROL_S},             Of<&ViewFrame::SaveTurned>},
    {"&Undo",             "Ctrl+Z",    {WXK_CONTROL_Z},                 Of<&ViewFrame::Undo>},
    {"Redo",              "Ctrl+Y",    {WXK_CONTROL_Y},                 Of<&ViewFrame::Redo>},
    {nullptr, nullptr, {}, nullptr},
    {"&Delete",           "Del",       {WXK_DELETE},                    Of<&ViewFrame::DeleteFile>},
    {"&Copy picture",     "Ctrl+C",    {WXK_CONTROL_C},                 Of<&ViewFrame::CopyPicture>},
    {"&Close",            "Esc",       {WXK_ESCAPE, WXK_RETURN, WXK_NUMPAD_ENTER}, Of<&ViewFrame::Leave>},
};
// clang-format on

}  // namespace

std::span<const KeyCommand<ViewFrame>> ViewCommands() { return kCommands; }

}  // namespace fotomill::desktop
