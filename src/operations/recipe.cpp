#include "operations/recipe.h"

#include <algorithm>
#include <charconv>
#include <cstdio>

#include "core/plain_name.h"
#include "core/text.h"
#include "core/whole_number.h"
#include "operations/macros.h"
#include "operations/operations.h"
#include "operations/recipe_words.h"
#include "texts/name_hint.h"

namespace fotomill {

namespace {

constexpr uint64_t kMostRecipeBytes = 1 << 20;
constexpr double kLongestText = 4096;
constexpr std::string_view kOutputWord = "output", kSaveWord = "save";

using enum ParameterKind;
constexpr Parameter kSave[] = {
    {.name = "to", .kind = kText, .preset = "", .least = 0, .most = 16, .label = "Format", .help = "Extension of the format to write."},
    {.name = "dest", .kind = kFile, .preset = "", .label = "Folder",
     .help = "Output folder, relative to the run's folder; created if needed."},
    {.name = "name", .kind = kText, .preset = "", .least = 0, .most = kLongestText, .label = "Name",
     .help = "Name of the file without extension; may have macros."},
    {.name = "quality", .kind = kInteger, .preset = "", .least = 1, .most = 100, .label = "Quality",
     .help = "Quality of lossy compression."},
    {.name = "max-bytes", .kind = kText, .preset = "", .least = 0, .most = 20, .label = "Maximum bytes",
     .help = "Uses the best quality that keeps the file within this size, such as 200k."},
};

bool IsName(std::string_view text) {
  return !text.empty() && std::ranges::all_of(text, [](char c) {
    return IsLetter(c) || (c >= '0' && c <= '9') || c == '-' || c == '_';
  });
}

// Formats the number of a color key, 0x00BBGGRR, in recipe syntax.
std::string ColorText(std::string_view number) {
  const auto value = ParseNumber<int32_t>(number);
  if (!value) return {};
  char text[8];
  const auto color = static_cast<uint32_t>(*value);
  std::snprintf(text, sizeof text, "#%02x%02x%02x", color & 0xff, color >> 8 & 0xff,
                color >> 16 & 0xff);
  return text;
}

// Converts a key's value to the text of a parameter; empty if not possible.
std::string KeyText(const Parameter& row, const KeyValues& keys) {
  if (*row.key == '\0' || !keys) return {};
  std::string text = keys(row.key);
  if (row.kind == kColor) text = ColorText(text);
  if (row.kind == kChoice && *row.keyWords != '\0') {
    const auto number = ParseNumber<int32_t>(text);
    text = number ? std::string(WordOf(row.keyWords, *number)) : std::string();
  }
  if (row.kind == kFlag && (text == "0" || text == "1")) text = text == "1" ? "yes" : "no";
  Value value;
  return ReadValue(row, text, value).empty() ? text : std::string();
}

// Parses a value and checks it beyond its kind; returns what is wrong.
RecordedText ReadChecked(const Parameter& row, std::string_view text, Value& value) {
  RecordedText wrong = ReadValue(row, text, value);
  return wrong.empty() && row.kind == kText ? MacroProblem(text) : wrong;
}

// Sets all parameters without a value to their defaults.
void FillDefaults(Arguments& arguments, const KeyValues& keys) {
  for (size_t i = 0; i < arguments.Rows().size(); ++i) {
    Value& value = arguments.At(i);
    if (value.given) continue;
    const auto text = DefaultText(arguments.Rows()[i], keys);
    if (!text || text->empty()) continue;
    (void)ReadValue(arguments.Rows()[i], *text, value);
    value.byDefault = true;
  }
}

std::vector<std::string_view> ParameterNames(std::span<const Parameter> rows) {
  std::vector<std::string_view> names;
  for (const Parameter& row : rows) names.emplace_back(row.name);
  return names;
}

RecordedText Sentence(RecordedText text) {
  for (std::string* form : {&text.english, &text.shown}) {
    if (!form->empty() && form->back() != '.' && form->back() != '?') *form += '.';
  }
  return text;
}

class Reader {
 public:
  explicit Reader(const KeyValues& keys) : keys_(keys) {}

  std::vector<Mistake> Read(std::string_view text, Recipe& recipe) {
    if (text.size() > kMostRecipeBytes) {
      AddMistake(1, {}, {}, TrRecorded("The recipe is longer than a megabyte."));
      return std::move(mistakes_);
    }
    const std::vector<RecipeLine> lines = SplitRecipe(text);
    if (lines.empty()) AddMistake(1, {}, {}, TrRecorded("The recipe has no operations."));
    for (const RecipeLine& line : lines) ReadLine(line);
    if (recipe_.outputs.empty()) recipe_.outputs.push_back(std::move(unnamed_));
    if (mistakes_.empty()) recipe = std::move(recipe_);
    return std::move(mistakes_);
  }

 private:
  void AddMistake(int32_t line, std::string operation, std::string parameter,
                  RecordedText message) {
    mistakes_.push_back(
        {line, std::move(operation), std::move(parameter), Sentence(std::move(message))});
  }

  RecipeOutput& Current() { return recipe_.outputs.empty() ? unnamed_ : recipe_.outputs.back(); }

  void ReadLine(const RecipeLine& line) {
    const std::string& name = line.words[0].text;
    if (line.open)
      return AddMistake(line.number, name, {}, TrRecorded("has a quote that does not end"));
    if (name == kOutputWord) return ReadOutput(line);
    if (Current().hasSave)
      return AddMistake(line.number, name, {},
                        TrRecorded("follows \"save\", which ends an output"));
    if (name == kSaveWord) return ReadSave(line);
    const Operation* const operation = FindOperation(name);
    if (operation == nullptr) return RefuseName(line.number, name);
    Step step{operation, Arguments(operation->parameters)};
    if (!ReadArguments(line, step.arguments)) return;
    if (operation->check != nullptr) {
      if (const ArgumentProblem problem = operation->check(step.arguments);
          !problem.message.empty()) {
        return AddMistake(line.number, name, problem.parameter, problem.message);
      }
    }
    (recipe_.outputs.empty() ? recipe_.common : Current().steps).push_back(std::move(step));
  }

  void RefuseName(int32_t line, const std::string& name) {
    std::vector<std::string_view> names{kOutputWord, kSaveWord};
    for (const Operation* operation : Operations()) names.emplace_back(operation->name);
    RecordedText message = TrRecorded("is not an operation.");
    message.Append(NearestNameQuestion(name, names));
    AddMistake(line, name, {}, std::move(message));
  }

  void ReadOutput(const RecipeLine& line) {
    const std::string word(kOutputWord);
    if (recipe_.outputs.empty() && unnamed_.hasSave) {
      return AddMistake(line.number, word, {},
                        TrRecorded("follows \"save\"; with outputs, each has its own"));
    }
    RecipeOutput output;
    if (line.words.size() != 2) {
      AddMistake(line.number, word, {}, TrRecorded("needs one name"));
    } else {
      output.name = line.words[1].text;
      if (output.name.empty() || output.name.size() > 64 || !IsPlainName(output.name)) {
        AddMistake(line.number, word, "name",
                   TrRecorded("must be a plain name, as it becomes part of file names"));
      }
      if (std::ranges::any_of(recipe_.outputs, [&](const RecipeOutput& other) {
            return other.name == output.name;
          })) {
        AddMistake(line.number, word, "name", TrRecorded("is taken by another output"));
      }
    }
    recipe_.outputs.push_back(std::move(output));
  }

  void ReadSave(const RecipeLine& line) {
    Arguments arguments(kSave);
    if (!ReadArguments(line, arguments)) return;
    SaveStep save{.to = arguments.Text("to"),
                  .folder = arguments.Text("dest"),
                  .name = arguments.Text("name"),
                  .quality = arguments.Integer("quality")};
    const std::string word(kSaveWord);
    if (arguments.Has("max-bytes")) {
      const auto bytes = ReadByteCount(arguments.Text("max-bytes"));
      if (!bytes)
        return AddMistake(line.number, word, "max-bytes",
                          TrRecorded("must be a number of bytes such as 40000, 200k or 2M"));
      if (save.quality != 0)
        return AddMistake(line.number, word, "max-bytes",
                          TrRecorded("cannot be combined with quality"));
      save.mostBytes = *bytes;
    }
    if (!IsPlainName(save.name))
      return AddMistake(line.number, word, "name",
                        TrRecorded("must be a plain name; dest names the folder"));
    Current().save = std::move(save);
    Current().hasSave = true;
  }

  // Parses the arguments after the operation's name. False on errors.
  bool ReadArguments(const RecipeLine& line, Arguments& arguments) {
    const size_t before = mistakes_.size();
    size_t next = 0;
    for (size_t i = 1; i < line.words.size(); ++i)
      ReadArgument(line, line.words[i], arguments, next);
    FillDefaults(arguments, keys_);
    for (size_t i = 0; i < arguments.Rows().size(); ++i) {
      const Parameter& row = arguments.Rows()[i];
      const bool missing = row.preset == nullptr && !arguments.At(i).given;
      if (missing && mistakes_.size() == before)
        AddMistake(line.number, line.words[0].text, row.name, TrRecorded("must be given"));
    }
    return mistakes_.size() == before;
  }

  void ReadArgument(const RecipeLine& line, const RecipeWord& word, Arguments& arguments,
                    size_t& next) {
    const std::string& operation = line.words[0].text;
    const std::span<const Parameter> rows = arguments.Rows();
    const auto indexOf = [&](std::string_view name) {
      return static_cast<size_t>(
          std::ranges::find_if(rows, [&](const Parameter& row) { return row.name == name; }) -
          rows.begin());
    };
    const std::string_view text = word.text;
    const bool named = word.equals != std::string::npos && IsName(text.substr(0, word.equals));
    const std::string name(named ? text.substr(0, word.equals) : std::string_view());
    size_t place = named ? indexOf(name) : indexOf(text);
    std::string_view value = named ? text.substr(word.equals + 1) : text;
    if (named && place == rows.size()) {
      const auto names = ParameterNames(rows);
      RecordedText message = TrRecorded("is not a parameter of %1.", operation);
      message.Append(NearestNameQuestion(name, names));
      return AddMistake(line.number, operation, name, std::move(message));
    }
    const bool flag = !named && !word.quoted && place < rows.size() && rows[place].kind == kFlag;
    if (flag) {
      value = "yes";
    } else if (!named) {
      place = next++;
      if (place >= rows.size())
        return AddMistake(line.number, operation, word.text,
                          TrRecorded("is one value too many"));
    }
    if (arguments.At(place).given)
      return AddMistake(line.number, operation, rows[place].name, TrRecorded("is given twice"));
    // an empty value leaves an optional parameter unset
    const bool unset =
        value.empty() && rows[place].preset != nullptr && *rows[place].preset == '\0';
    if (unset) return;
    if (const RecordedText wrong = ReadChecked(rows[place], value, arguments.At(place));
        !wrong.empty()) {
      AddMistake(line.number, operation, rows[place].name, wrong);
      arguments.At(place).given = true;  // reported once
    }
  }

  const KeyValues& keys_;
  Recipe recipe_;
  RecipeOutput unnamed_;
  std::vector<Mistake> mistakes_;
};

void AppendNamed(std::string& line, std::string_view name, std::string_view value) {
  line.append(" ").append(name).append("=").append(QuotedWord(value));
}

std::string PrintSave(const SaveStep& save) {
  std::string line(kSaveWord);
  if (!save.to.empty()) AppendNamed(line, "to", save.to);
  if (!save.folder.empty()) AppendNamed(line, "dest", save.folder);
  if (!save.name.empty()) AppendNamed(line, "name", save.name);
  if (save.quality > 0) AppendNamed(line, "quality", std::to_string(save.quality));
  if (save.mostBytes > 0) AppendNamed(line, "max-bytes", std::to_string(save.mostBytes));
  return line;
}

}  // namespace

const Operation* Recipe::First() const {
  if (!common.empty()) return common.front().operation;
  for (const RecipeOutput& output : outputs) {
    if (!output.steps.empty()) return output.steps.front().operation;
  }
  return nullptr;
}

bool Recipe::OnlyMovesPixels() const {
  const auto moves = [](const Step& step) {
    return step.operation->moves != nullptr && step.operation->moves(step.arguments);
  };
  return HasSteps() && std::ranges::all_of(common, moves) &&
         std::ranges::all_of(outputs, [&](const RecipeOutput& output) {
           return std::ranges::all_of(output.steps, moves);
         });
}

std::string Mistake::Text(bool withLine) const {
  std::string text = message.shown;
  if (!parameter.empty()) {
    text = Tr("%1: \"%2\" %3", operation, parameter, text);
  } else if (!operation.empty()) {
    text = Tr("\"%1\" %2", operation, text);
  }
  return withLine ? Tr("Line %1: %2", line, text) : text;
}

std::vector<Mistake> ReadRecipe(std::string_view text, const KeyValues& keys, Recipe& recipe) {
  return Reader(keys).Read(text, recipe);
}

std::string PrintStep(const Step& step) {
  std::string line = step.operation->name;
  const std::span<const Parameter> rows = step.arguments.Rows();
  for (size_t i = 0; i < rows.size(); ++i) {
    const Value& value = step.arguments.At(i);
    if (!value.given || value.byDefault) continue;
    const bool bare = i == 0 && rows[i].kind != kFlag && rows[i].kind != kText;
    if (bare) {
      line.append(" ").append(QuotedWord(value.text));
    } else {
      AppendNamed(line, rows[i].name, value.text);
    }
  }
  return line;
}

std::string PrintRecipe(const Recipe& recipe) {
  std::string text;
  for (const Step& step : recipe.common) text.append(PrintStep(step)).append("\n");
  for (const RecipeOutput& output : recipe.outputs) {
    const std::string indent = output.name.empty() ? "" : "  ";
    if (!output.name.empty()) text.append("output ").append(QuotedWord(output.name)).append("\n");
    for (const Step& step : output.steps) text.append(indent).append(PrintStep(step)).append("\n");
    if (output.hasSave) text.append(indent).append(PrintSave(output.save)).append("\n");
  }
  return text;
}

Step DefaultStep(const Operation& operation, const KeyValues& keys) {
  Step step{&operation, Arguments(operation.parameters)};
  FillDefaults(step.arguments, keys);
  return step;
}

RecordedText SetArgument(Step& step, std::string_view parameter, std::string_view text) {
  const std::span<const Parameter> rows = step.arguments.Rows();
  for (size_t i = 0; i < rows.size(); ++i) {
    if (rows[i].name == parameter) return ReadChecked(rows[i], text, step.arguments.At(i));
  }
  return TrRecorded("is not a parameter of %1.", step.operation->name);
}

std::optional<std::string> DefaultText(const Parameter& row, const KeyValues& keys) {
  if (std::string text = KeyText(row, keys); !text.empty()) return text;
  return row.preset == nullptr ? std::nullopt : std::optional<std::string>(row.preset);
}

std::span<const Parameter> SaveParameters() { return kSave; }

std::optional<uint64_t> ReadByteCount(std::string_view text) {
  uint64_t number = 0;
  const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), number);
  if (error != std::errc() || number == 0 || number > (uint64_t{1} << 40)) return std::nullopt;
  text.remove_prefix(static_cast<size_t>(end - text.data()));
  if (text.empty()) return number;
  if (EqualIgnoringCase(text, "k")) return number << 10;
  return EqualIgnoringCase(text, "m") ? std::optional(number << 20) : std::nullopt;
}

}  // namespace fotomill
