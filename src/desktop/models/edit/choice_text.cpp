#include "desktop/models/edit/choice_text.h"

#include <algorithm>
#include <iterator>

#include "operations/operations.h"
#include "texts/texts.h"

namespace fotomill::desktop {

namespace {

// The words of choices; those that are missing are units, "cm", and shown as they are.
struct ShownWord {
  std::string_view word;
  const char* shown;
};
// clang-format off
constexpr ShownWord kWords[] = {
    {"above", TrLater("Above")}, {"all", TrLater("All")}, {"alpha", TrLater("Alpha")},
    {"atkinson", "Atkinson"}, {"bayer2", TrLater("Bayer 2 x 2")},
    {"bayer4", TrLater("Bayer 4 x 4")}, {"bayer8", TrLater("Bayer 8 x 8")},
    {"below", TrLater("Below")}, {"bicubic", TrLater("Bicubic")},
    {"bilinear", TrLater("Bilinear")}, {"blue", TrLater("Blue")}, {"both", TrLater("Both")},
    {"bottom", TrLater("Bottom")}, {"bottom-left", TrLater("Bottom left")},
    {"bottom-right", TrLater("Bottom right")}, {"box", TrLater("Box")}, {"burkes", "Burkes"},
    {"center", TrLater("Center")}, {"each", TrLater("Each")}, {"faces", TrLater("Faces")},
    {"fill", TrLater("Fill")}, {"fit", TrLater("Fit")}, {"floyd-steinberg", "Floyd-Steinberg"},
    {"gaussian", TrLater("Gaussian")}, {"green", TrLater("Green")},
    {"green-blue", TrLater("Green and blue")}, {"grow", TrLater("Grow")},
    {"horizontal", TrLater("Horizontal")}, {"keep", TrLater("Keep")}, {"lanczos3", "Lanczos 3"},
    {"left", TrLater("Left")}, {"mitchell", "Mitchell"}, {"nearest", TrLater("Nearest")},
    {"none", TrLater("None")}, {"pad", TrLater("Pad")}, {"raised", TrLater("Raised")},
    {"red", TrLater("Red")}, {"red-blue", TrLater("Red and blue")},
    {"red-green", TrLater("Red and green")}, {"right", TrLater("Right")},
    {"salt-pepper", TrLater("Salt and pepper")}, {"shrink", TrLater("Shrink")},
    {"sierra", "Sierra"}, {"spin", TrLater("Spin")}, {"stretch", TrLater("Stretch")},
    {"stucki", "Stucki"}, {"sunken", TrLater("Sunken")}, {"together", TrLater("Together")},
    {"top", TrLater("Top")}, {"top-left", TrLater("Top left")},
    {"top-right", TrLater("Top right")}, {"triangle", TrLater("Triangle")},
    {"uniform", TrLater("Uniform")}, {"vertical", TrLater("Vertical")}, {"zoom", TrLater("Zoom")},
};
// clang-format on

std::string ValueText(const Parameter& row, const Value& value) {
  switch (row.kind) {
    case ParameterKind::kChoice: return ChoiceText(WordOf(row.choices, value.choice));
    case ParameterKind::kFlag: return value.choice != 0 ? Tr("yes") : Tr("no");
    default: return value.text;
  }
}

}  // namespace

std::string ChoiceText(std::string_view word) {
  const auto* const row = std::ranges::find(kWords, word, &ShownWord::word);
  return row == std::end(kWords) ? std::string(word) : Tr(row->shown);
}

std::string StepText(const Step& step) {
  std::string text = Tr(step.operation->label);
  const auto rows = step.arguments.Rows();
  const char* separator = ": ";
  for (size_t i = 0; i < rows.size(); ++i) {
    const Value& value = step.arguments.At(i);
    if (!value.given || value.byDefault) continue;
    text.append(separator);
    if (rows.size() > 1) text.append(Tr(rows[i].label)).append(" ");
    text.append(ValueText(rows[i], value));
    separator = ", ";
  }
  return text;
}

}  // namespace fotomill::desktop
