#include "cli/commands/operations.h"

#include <cstdio>
#include <memory>
#include <string>

#include "cli/frame/options.h"
#include "cli/frame/result_output.h"
#include "texts/name_hint.h"
#include "operations/operations.h"
#include "operations/recipe.h"
#include "settings/key_texts.h"
#include "texts/texts.h"

namespace fotomill::cli {

namespace {

// Splits a list separated by "|".
Json WordsOf(std::string_view list) {
  Json words = Json::array();
  for (int32_t i = 0; !WordOf(list, i).empty(); ++i) words.push_back(WordOf(list, i));
  return words;
}

bool HasLimits(const Parameter& row) {
  switch (row.kind) {
    case ParameterKind::kInteger:
    case ParameterKind::kNumber:
    case ParameterKind::kPercent:
    case ParameterKind::kAngle:
    case ParameterKind::kLength:
    case ParameterKind::kSize: return true;
    default: return false;
  }
}

Json Described(const Parameter& row) {
  const auto preset = DefaultText(row, KeyTextInForce);
  Json object{{"name", row.name}, {"kind", KindName(row.kind)}, {"unit", row.unit}};
  object["default"] = preset ? Json(*preset) : Json();
  const bool limits = HasLimits(row);
  object["least"] = limits && row.least > -1e9 ? Json(row.least) : Json();
  object["most"] = limits && row.most < 1e9 ? Json(row.most) : Json();
  object["choices"] = WordsOf(row.choices);
  object["label"] = row.label;
  object["help"] = row.help;
  return object;
}

Json Described(const Operation& operation) {
  Json parameters = Json::array();
  for (const Parameter& row : operation.parameters) parameters.push_back(Described(row));
  return {{"name", operation.name},
          {"family", FamilyName(operation.family)},
          {"label", operation.label},
          {"help", operation.help},
          {"works", WorksName(operation.works)},
          {"parameters", std::move(parameters)},
          {"example", operation.example}};
}

std::string Padded(std::string_view text, size_t width) {
  std::string padded(text);
  if (padded.size() < width) padded.append(width - padded.size(), ' ');
  return padded;
}

std::string Number(double number) {
  char text[40];
  std::snprintf(text, sizeof text, "%.10g", number);  // no exponent, as values cannot have one
  return text;
}

// A short description of a parameter's values.
std::string Takes(const Parameter& row) {
  if (*row.choices != '\0') {
    std::string words(row.choices);
    for (char& c : words) {
      if (c == '|') c = ' ';
    }
    return words;
  }
  std::string takes(KindName(row.kind));
  if (HasLimits(row) && row.most < 1e9)
    takes += " " + Number(row.least) + " to " + Number(row.most);
  if (*row.unit != '\0') takes.append(" ").append(row.unit);
  return takes;
}

void Explain(const Operation& operation, ResultOutput& output) {
  std::string usage = operation.name;
  for (const Parameter& row : operation.parameters) {
    const bool needed = row.preset == nullptr;
    usage.append(needed ? " " : " [").append(row.name).append(needed ? "" : "]");
  }
  output.Line(usage);
  output.Line("");
  output.Line(Tr(operation.help));
  if (!operation.parameters.empty()) output.Line("");
  for (const Parameter& row : operation.parameters) {
    const auto preset = DefaultText(row, KeyTextInForce);
    std::string line = "  " + Padded(row.name, 12) + " " + Tr(row.help);
    output.Line(line);
    line = "  " + Padded("", 12) + " " + Takes(row);
    if (!preset || !preset->empty())
      line.append("; ").append(preset ? Tr("default %1", *preset) : Tr("required"));
    output.Line(line);
  }
  output.Line("");
  output.Line(Tr("Example: %1", operation.example));
}

int RunOperations(bool json, const CommandContext& context) {
  const Operation* one = nullptr;
  if (!context.names.values.empty()) {
    const std::string& name = context.names.values[0];
    one = FindOperation(name);
    std::vector<std::string_view> names;
    for (const Operation* operation : Operations()) names.emplace_back(operation->name);
    if (one == nullptr)
      return UsageError(context,
                        Tr("Unknown operation \"%1\".", name) + NearestNameHint(name, names));
  }
  ResultOutput output(context, json);
  if (one != nullptr && !json) {
    Explain(*one, output);
    return kExitOk;
  }
  Family family = Family::Matt;
  bool first = true;
  for (const Operation* operation : Operations()) {
    if (one != nullptr && operation != one) continue;
    if (json) {
      output.Element(Described(*operation));
      continue;
    }
    if (first || operation->family != family)
      output.Line(std::string(first ? "" : "\n") + std::string(FamilyName(operation->family)));
    family = operation->family;
    first = false;
    output.Line("  " + Padded(operation->name, 16) + Tr(operation->help));
  }
  return kExitOk;
}

}  // namespace

void SetUpOperations(CLI::App& app, CommandContext& context) {
  auto json = std::make_shared<bool>(false);
  context.names.Declare("[NAME]", "Operation to explain (default: list all)", 0, 1);
  AddFlag(app, "--json", *json, "Print a JSON array of the operations and their parameters");
  SetFooter(app, nullptr, "fotomill operations resize");
  context.run = [json, &context] { return RunOperations(*json, context); };
}

}  // namespace fotomill::cli
