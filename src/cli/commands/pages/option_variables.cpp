#include "cli/commands/pages/option_variables.h"

#include <cstdlib>

#include "cli/frame/options.h"

namespace fotomill::cli {

void OptionVariables::Add(CLI::App& app, std::span<const PageOption> options) {
  for (const PageOption& option : options) AddOne(app, option);
}

void OptionVariables::AddOne(CLI::App& app, const PageOption& option) {
  Variable& variable = variables_.emplace_back(Variable{.option = &option, .text = option.usual});
  const std::string name = std::string("--") + option.name;
  switch (option.kind) {
    case PageOptionKind::Flag: AddFlag(app, name.c_str(), variable.flag, option.help); return;
    case PageOptionKind::Text:
      AddText(app, name.c_str(), variable.text, option.shownAs, option.help);
      return;
    case PageOptionKind::Texts:
      AddRepeatedText(app, name.c_str(), variable.texts, option.shownAs, option.help);
      return;
    case PageOptionKind::Number:
      variable.number = std::atoi(option.usual);
      AddNumber(app, name.c_str(), variable.number, option.shownAs, option.least, option.most,
                option.help);
      return;
    case PageOptionKind::Choice:
      AddChoice(app, name.c_str(), variable.text, option.shownAs, option.help, option.choices);
      return;
  }
}

PageValues OptionVariables::Values() const {
  PageValues values;
  for (const Variable& variable : variables_) values.Set(variable.option->name, ValueOf(variable));
  return values;
}

std::string OptionVariables::ValueOf(const Variable& variable) {
  switch (variable.option->kind) {
    case PageOptionKind::Flag: return variable.flag ? "yes" : "";
    case PageOptionKind::Number: return std::to_string(variable.number);
    case PageOptionKind::Texts: break;
    default: return variable.text;
  }
  std::string all;
  for (const std::string& text : variable.texts) all += (all.empty() ? "" : ",") + text;
  return all;
}

}  // namespace fotomill::cli
