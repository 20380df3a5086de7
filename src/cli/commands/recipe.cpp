#include "cli/commands/recipe.h"

#include <memory>
#include <string>

#include "cli/frame/options.h"
#include "cli/frame/result_output.h"
#include "operations/recipe.h"
#include "operations/recipe_library.h"
#include "settings/key_texts.h"
#include "texts/texts.h"

namespace fotomill::cli {

namespace {

// The names of a recipe's operations, in order.
std::vector<std::string> OperationsOf(const Recipe& recipe) {
  std::vector<std::string> names;
  for (const Step& step : recipe.common) names.emplace_back(step.operation->name);
  for (const RecipeOutput& output : recipe.outputs) {
    for (const Step& step : output.steps) names.emplace_back(step.operation->name);
  }
  return names;
}

int RunList(bool json, const CommandContext& context) {
  ResultOutput output(context, json);
  for (const NamedRecipe& named : ListRecipes()) {
    std::string text, path;
    Recipe recipe;
    const bool right =
        FindRecipe(named.path.empty() ? named.name : named.path, text, path).empty() &&
        ReadRecipe(text, KeyTextInForce, recipe).empty();
    const std::vector<std::string> names =
        right ? OperationsOf(recipe) : std::vector<std::string>();
    if (json) {
      Json element;
      PutName(element, "name", named.name);
      PutName(element, "path", named.path);
      element["operations"] = names;
      output.Element(element);
      continue;
    }
    std::string line = output.Shown(named.name) + "\t";
    for (const std::string& name : names) line.append(&name == &names[0] ? "" : ", ").append(name);
    output.Line(right ? line : line + Tr("(has mistakes)"));
  }
  return kExitOk;
}

int RunShow(bool json, const CommandContext& context) {
  std::string text, path;
  if (const std::string wrong = FindRecipe(context.names.values[0], text, path); !wrong.empty())
    return UsageError(context, wrong);
  ResultOutput output(context, json);
  if (json) {
    Json element;
    PutName(element, "name", context.names.values[0]);
    PutName(element, "path", path);
    element["text"] = text;
    output.Element(element);
  } else {
    if (text.ends_with('\n')) text.pop_back();
    output.Line(text);
  }
  return kExitOk;
}

int RunCheck(bool json, const CommandContext& context) {
  int status = kExitOk;
  ResultOutput output(context, json);
  for (const std::string& name : context.names.values) {
    std::string text, path;
    Recipe recipe;
    std::vector<Mistake> mistakes;
    if (const std::string wrong = FindRecipe(name, text, path); !wrong.empty()) {
      output.Message(output.ShownMessage(wrong));
      status = kExitUsage;
    } else {
      mistakes = ReadRecipe(text, KeyTextInForce, recipe);
    }
    for (const Mistake& mistake : mistakes) {
      status = kExitUsage;
      if (json) {
        output.Element({{"line", mistake.line},
                        {"operation", mistake.operation},
                        {"parameter", mistake.parameter},
                        {"message", mistake.message.english}});
      } else {
        output.Message(output.ShownMessage(name + ": " + mistake.Text()));
      }
    }
  }
  return status;
}

}  // namespace

void SetUpRecipeList(CLI::App& app, CommandContext& context) {
  auto json = std::make_shared<bool>(false);
  AddFlag(app, "--json", *json, "Print a JSON array of {name, path, operations}");
  SetFooter(app,
            "Recipes are the files NAME.recipe in the folder \"recipes\" of the data folder, and "
            "six built-in ones.",
            "fotomill recipe list");
  context.run = [json, &context] { return RunList(*json, context); };
}

void SetUpRecipeShow(CLI::App& app, CommandContext& context) {
  auto json = std::make_shared<bool>(false);
  context.names.Declare("FILE|NAME", "Recipe to print", 1, 1);
  AddFlag(app, "--json", *json, "Print a JSON array of {name, path, text}");
  SetFooter(app, nullptr, "fotomill recipe show web");
  context.run = [json, &context] { return RunShow(*json, context); };
}

void SetUpRecipeCheck(CLI::App& app, CommandContext& context) {
  auto json = std::make_shared<bool>(false);
  context.names.Declare("FILE...", "Recipes to check", 1);
  AddFlag(app, "--json", *json, "Print a JSON array of {line, operation, parameter, message}");
  SetFooter(app, "The exit status is 2 if a recipe has mistakes.",
            "fotomill recipe check holiday.recipe");
  context.run = [json, &context] { return RunCheck(*json, context); };
}

}  // namespace fotomill::cli
