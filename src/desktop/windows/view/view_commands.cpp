#include "desktop/windows/view/view_commands.h"

#include <wx/defs.h>

#include "desktop/windows/edit/quick_menu.h"
#include "desktop/windows/view/view_file_commands.h"
#include "desktop/windows/view/view_frame.h"
#include "texts/texts.h"

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
template <Orientation turn>
void Turn(ViewFrame& view) {
  view.Turn(turn);
}
template <int key>
void Tag(ViewFrame& view) {
  TagByKey(view, key);
}
template <int32_t Settings::*setting>
constexpr auto Switch = SwitchSetting<ViewFrame, setting>;
template <int32_t Settings::*setting>
constexpr auto IsOn = SettingIsOn<ViewFrame, setting>;
void First(ViewFrame& view) { view.GoTo(0); }
void Last(ViewFrame& view) { view.GoTo(view.LastPlace()); }

// clang-format off
constexpr KeyCommand<ViewFrame> kCommands[] = {
    {TrLater("&Next"),             "Page Down", {WXK_PAGEDOWN, 'N'},             Step<1>},
    {TrLater("&Previous"),         "Backspace", {WXK_BACK, WXK_PAGEUP, 'P'},     Step<-1>},
    {TrLater("&First"),            "Home",      {WXK_HOME},                      First},
    {TrLater("&Last"),             "End",       {WXK_END},                       Last},
    {nullptr, nullptr, {}, nullptr},
    {TrLater("Zoom &in"),          "+",         {'+', '=', WXK_NUMPAD_ADD},      OfCanvas<&ViewCanvas::ZoomIn>},
    {TrLater("Zoom &out"),         "-",         {'-', WXK_NUMPAD_SUBTRACT},      OfCanvas<&ViewCanvas::ZoomOut>},
    {TrLater("Fit to &window"),    "Z",         {'Z', '*', WXK_NUMPAD_MULTIPLY},   Zoom<ZoomMode::Fit>},
    {TrLater("&Actual size"),      "A",         {'A', '/', WXK_NUMPAD_DIVIDE},     OfCanvas<&ViewCanvas::ZoomActual>},
    {TrLater("Fit to wi&dth"),     "W",         {'W'},                           Zoom<ZoomMode::FitWidth>},
    {TrLater("Fi&ll the window"),  "D",         {'D'},                           Zoom<ZoomMode::Fill>},
    {TrLater("&Keep zoom and position between pictures"), "K", {'K'},               Switch<&Settings::ViewModeKeepZoom>, IsOn<&Settings::ViewModeKeepZoom>},
    {nullptr, nullptr, {}, nullptr},
    {TrLater("Play, pause or ne&xt"), "Space",  {WXK_SPACE},                     Of<&ViewFrame::PlayOrNext>},
    {TrLater("Next frame"),        ".",         {'.'},                           StepFrame<1>},
    {TrLater("Previous frame"),    ",",         {','},                           StepFrame<-1>},
    {TrLater("Next pa&ge"),        "]",         {']'},                           StepPage<1>},
    {TrLater("Pre&vious page"),    "[",         {'['},                           StepPage<-1>},
    {nullptr, nullptr, {}, nullptr},
    {TrLater("Full &screen"),      "F11",       {WXK_F11, 'F'},                  Of<&ViewFrame::ToggleFullScreen>},
    {TrLater("Slides&how"),        "S",         {'S', WXK_F8},                   Of<&ViewFrame::ToggleSlideshow>},
    {TrLater("Slidesho&w..."),     "Shift+S",   {},                              Of<&ViewFrame::ChooseSlideshow>},
    {TrLater("In&formation"),      "I",         {'I'},                           Of<&ViewFrame::ToggleOverlay>},
    {TrLater("Apply color pro&file"), "M",    {'M'},                           Switch<&Settings::ViewModeColorProfiles>, IsOn<&Settings::ViewModeColorProfiles>},
    {TrLater("Check&erboard behind transparency"), "B", {'B'},                   Switch<&Settings::ViewModeCheckerboard>, IsOn<&Settings::ViewModeCheckerboard>},
    {TrLater("G&et info..."),      "Alt+Enter", {},                              ShowInfoOf},
    {TrLater("Edit EXIF..."),      "E",         {'E'},                           EditExifOf},
    {nullptr, nullptr, {}, nullptr},
    {TrLater("Rotate &left"),      "L",         {'L'},                           Turn<Orientation::QuarterLeft>},
    {TrLater("Rotate &right"),     "R",         {'R'},                           Turn<Orientation::QuarterRight>},
    {TrLater("Flip horizontally"), "H",       {'H'},                           Turn<Orientation::MirrorAcross>},
    {TrLater("Flip vertically"), "V",       {'V'},                           Turn<Orientation::MirrorDown>},
    {TrLater("Crop..."),           "C",         {'C'},                           CropFileOf},
    {TrLater("Edit..."),           "F4",        {WXK_F4},                        EditFileOf},
    {TrLater("&Quick actions"),    "",          {},                              nullptr, nullptr, NewQuickMenu},
    {TrLater("Sa&ve rotated picture"), "Ctrl+S", {WXK_CONTROL_S},             Of<&ViewFrame::SaveTurned>},
    {TrLater("&Undo"),             "Ctrl+Z",    {WXK_CONTROL_Z},                 Of<&ViewFrame::Undo>},
    {TrLater("Redo"),              "Ctrl+Y",    {WXK_CONTROL_Y},                 Of<&ViewFrame::Redo>},
    {nullptr, nullptr, {}, nullptr},
    {TrLater("No stars"),          "0",         {'0', WXK_NUMPAD0},              Tag<'0'>},
    {TrLater("1 star"),            "1",         {'1', WXK_NUMPAD1},              Tag<'1'>},
    {TrLater("2 stars"),           "2",         {'2', WXK_NUMPAD2},              Tag<'2'>},
    {TrLater("3 stars"),           "3",         {'3', WXK_NUMPAD3},              Tag<'3'>},
    {TrLater("4 stars"),           "4",         {'4', WXK_NUMPAD4},              Tag<'4'>},
    {TrLater("5 stars"),           "5",         {'5', WXK_NUMPAD5},              Tag<'5'>},
    {TrLater("Red"),               "6",         {'6', WXK_NUMPAD6},              Tag<'6'>},
    {TrLater("Yellow"),            "7",         {'7', WXK_NUMPAD7},              Tag<'7'>},
    {TrLater("Green"),             "8",         {'8', WXK_NUMPAD8},              Tag<'8'>},
    {TrLater("Blue"),              "9",         {'9', WXK_NUMPAD9},              Tag<'9'>},
    {TrLater("Co&mment..."),       "T",         {'T'},                           CommentOn},
    {nullptr, nullptr, {}, nullptr},
    {TrLater("&Print..."),         "Ctrl+P",    {WXK_CONTROL_P},                 PrintFileOf},
    {TrLater("&Delete"),           "Del",       {WXK_DELETE},                    Of<&ViewFrame::DeleteFile>},
    {TrLater("&Copy picture"),     "Ctrl+C",    {WXK_CONTROL_C},                 CopyPictureOf},
    {TrLater("&Close"),            "Esc",       {WXK_ESCAPE, WXK_RETURN, WXK_NUMPAD_ENTER}, Of<&ViewFrame::Leave>},
};
// clang-format on

constexpr MenuGroup kMenus[] = {{TrLater("&File"), 5}, {TrLater("Pict&ure"), 4},
                                {TrLater("&Zoom"), 1}, {TrLater("&View"), 3},
                                {TrLater("&Go"), 0},   {TrLater("&Pages"), 2}};

}  // namespace

std::span<const MenuGroup> ViewMenus() { return kMenus; }

std::span<const KeyCommand<ViewFrame>> ViewCommands() { return kCommands; }

}  // namespace fotomill::desktop
