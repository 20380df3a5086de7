#include "cli/commands/config.h"

#include <memory>
#include <string>
#include <vector>

#include "cli/frame/options.h"
#include "cli/frame/result_output.h"
#include "cli/frame/shown_text.h"
#include "core/utf8.h"
#include "platform/files.h"
#include "settings/configuration.h"
#include "settings/key_help.h"
#include "texts/system_reason.h"
#include "texts/texts.h"

namespace fotomill::cli {

namespace {

constexpr size_t kTextWidth = 76;  // for descriptions

struct ConfigOptions {
  bool json = false;
  bool changed = false;
  bool used = false;
  bool dryRun = false;
};

// Configuration texts are bytes. Invalid UTF-8 is treated as Latin-1.
std::string JsonText(std::string_view text) {
  if (IsUtf8(text)) return std::string(text);
  std::string wide;
  for (const char c : text) {
    const auto byte = static_cast<unsigned char>(c);
    if (byte < 0x80) {
      wide += c;
    } else {
      wide += static_cast<char>(0xC0 | byte >> 6);
      wide += static_cast<char>(0x80 | (byte & 0x3F));
    }
  }
  return wide;
}

Json KeyElement(const KeyRow& row) {
  Json element{{"name", row.name}, {"type", row.type}};
  if ((row.type & KEY_TEXT) != 0) {
    element["value"] = JsonText(TextIn(row));
    element["default"] = JsonText(DefaultText(row));
  } else {
    element["value"] = NumberIn(row);
    element["default"] = DefaultNumber(row);
  }
  element["used"] = IsKeyUsed(row);
  element["values"] = ValuesText(row).english;
  element["description"] = KeyHelp(row);
  return element;
}

std::string UnknownKey(const std::string& name) {
  return Tr("Unknown key \"%1\"; the nearest is %2.", name, NearestKey(name));
}

void PrintProblem(const CommandContext& context, std::string_view message) {
  const std::string path =
      context.io.errTerminal ? EscapeControls(ConfigurationPath()) : ConfigurationPath();
  std::fprintf(context.io.err, "%s: %.*s\n", path.empty() ? "fotomill" : path.c_str(),
               static_cast<int>(message.size()), message.data());
}

// Finds the rows of the given keys; false, after printing a message, for an unknown key.
bool FindKeys(const CommandContext& context, std::vector<const KeyRow*>& rows) {
  for (const std::string& name : context.names.values) {
    rows.push_back(FindKey(name));
    if (rows.back() != nullptr) continue;
    UsageError(context, UnknownKey(name));
    return false;
  }
  return true;
}

void NoteUnreadable(const CommandContext& context) {
  if (StateOfConfiguration() != ConfigurationState::Unreadable) return;
  PrintProblem(context, Tr("The configuration file cannot be read; the defaults apply."));
}

void NoteUnused(const CommandContext& context, ResultOutput& output, const KeyRow& row) {
  if (!IsKeyUsed(row))
    output.Note(std::string("fotomill: ") + context.command->name + ": " + UnusedKeyText(row));
}

// Prints the description of a key, indented.
void Explain(ResultOutput& output, const KeyRow& row) {
  const auto line = [&](const std::string& text) { output.Line("    " + output.Shown(text)); };
  line(Tr("Default: %1", ReadableDefault(row)));
  line(Tr("Takes %1.", ValuesText(row).shown));
  if (!IsKeyUsed(row)) return line(UnusedKeyText(row));
  for (const std::string& text : WrappedLines(KeyHelp(row), kTextWidth)) line(text);
}

int RunDescribe(const ConfigOptions& options, const CommandContext& context) {
  std::vector<const KeyRow*> rows;
  if (!FindKeys(context, rows)) return kExitUsage;
  NoteUnreadable(context);
  ResultOutput output(context, options.json);
  for (const KeyRow* row : rows) {
    if (output.IsJson()) {
      output.Element(KeyElement(*row));
      continue;
    }
    output.Line(output.Shown(std::string(row->name) + "=" + ReadableValue(*row)));
    Explain(output, *row);
  }
  return kExitOk;
}

int RunList(const ConfigOptions& options, const CommandContext& context) {
  NoteUnreadable(context);
  ResultOutput output(context, options.json);
  for (const KeyRow& row : Keys()) {
    if (options.changed && (IsAtDefault(row) || (row.type & KEY_INTERNAL) != 0)) continue;
    if (options.used && !IsKeyUsed(row)) continue;
    if (output.IsJson()) {
      output.Element(KeyElement(row));
    } else {
      output.Line(output.Shown(std::string(row.name) + "=" + ValueText(row)));
      if (context.global.verbose) Explain(output, row);
    }
  }
  return kExitOk;
}

int RunGet(const ConfigOptions& options, const CommandContext& context) {
  std::vector<const KeyRow*> rows;
  if (!FindKeys(context, rows)) return kExitUsage;
  NoteUnreadable(context);
  ResultOutput output(context, options.json);
  for (const KeyRow* row : rows) {
    if (output.IsJson()) {
      output.Element(KeyElement(*row));
    } else {
      output.Line(output.Shown(ValueText(*row)));
    }
  }
  return kExitOk;
}

// Makes a change, or only shows it in a dry run: "KEY: OLD -> NEW".
int Change(const ConfigOptions& options, const CommandContext& context, const KeyRow& row,
           const SettingValue* value) {
  const std::string before = ValueText(row);
  SaveResult result = SaveResult::Done;
  if (!options.dryRun) {
    result = value != nullptr ? StoreSetting(row, *value) : RemoveSetting(row);
  } else if (value != nullptr) {
    StoreValue(row, *value);
  } else {
    StoreDefault(row);
  }
  if (const std::string message = Tr(SaveMessage(result)); !message.empty()) {
    PrintProblem(context, WithReason(message));
    return kExitFailed;
  }
  ResultOutput output(context, options.json);
  if (output.IsJson()) {
    output.Element(KeyElement(row));
  } else {
    output.Line(output.Shown(std::string(row.name) + ": " + before + " -> " + ValueText(row)));
  }
  if (value != nullptr) NoteUnused(context, output, row);
  return kExitOk;
}

int RunSet(const ConfigOptions& options, const CommandContext& context) {
  const std::string& name = context.names.values[0];
  const KeyRow* const row = FindKey(name);
  if (row == nullptr) {
    return UsageError(context, UnknownKey(name));
  }
  const SettingValue value = ReadValue(*row, context.names.values[1], ValueSource::Person);
  if (!value.usable) return UsageError(context, FaultMessage(*row, value.fault));
  return Change(options, context, *row, &value);
}

int RunUnset(const ConfigOptions& options, const CommandContext& context) {
  std::vector<const KeyRow*> rows;
  if (!FindKeys(context, rows)) return kExitUsage;
  return Change(options, context, *rows[0], nullptr);
}

int RunPath(const ConfigOptions& options, const CommandContext& context) {
  const std::string path = ConfigurationPath();
  if (path.empty()) {
    PrintProblem(context, Tr(SaveMessage(SaveResult::NoFolder)));
    return kExitFailed;
  }
  ResultOutput output(context, options.json);
  if (output.IsJson()) {
    Json element;
    PutName(element, "path", path);
    element["exists"] = platform::FileExists(path);
    output.Element(element);
  } else {
    output.Line(output.Shown(path));
  }
  return kExitOk;
}

using Run = int (*)(const ConfigOptions& options, const CommandContext& context);

std::shared_ptr<ConfigOptions> SetUp(CLI::App& app, CommandContext& context, Run run,
                                     const char* jsonHelp, const char* example) {
  auto options = std::make_shared<ConfigOptions>();
  AddFlag(app, "--json", options->json, jsonHelp);
  SetFooter(app, nullptr, example);
  context.run = [options, &context, run] { return run(*options, context); };
  return options;
}

constexpr const char* kKeyJson =
    TrLater("Print a JSON array of {name, type, value, default, used, values, description}");

}  // namespace

void SetUpConfigList(CLI::App& app, CommandContext& context) {
  const auto options = SetUp(app, context, RunList, kKeyJson, "fotomill config list --changed");
  AddFlag(app, "--changed", options->changed, "Only keys that differ from their defaults");
  AddFlag(app, "--used", options->used, "Only keys that this build uses");
  SetFooter(app, "With --verbose, what each key does and which values it takes.",
            "fotomill config list --changed");
}

void SetUpConfigGet(CLI::App& app, CommandContext& context) {
  context.names.Declare("KEY...", "Key names; their values are printed one per line", 1);
  SetUp(app, context, RunGet, kKeyJson, "fotomill config get JpegCompression");
}

void SetUpConfigDescribe(CLI::App& app, CommandContext& context) {
  context.names.Declare("KEY...", "Key names", 1);
  SetUp(app, context, RunDescribe, kKeyJson, "fotomill config describe JpegCompression");
}

void SetUpConfigSet(CLI::App& app, CommandContext& context) {
  context.names.Declare("KEY VALUE", "Key name and its new value", 2, 2);
  const auto options =
      SetUp(app, context, RunSet, kKeyJson, "fotomill config set AlphaBackground '#FFEEDD'");
  AddFlag(app, "-n,--dry-run", options->dryRun, "Only show what would change");
}

void SetUpConfigUnset(CLI::App& app, CommandContext& context) {
  context.names.Declare("KEY", "Name of the key to reset", 1, 1);
  const auto options =
      SetUp(app, context, RunUnset, kKeyJson, "fotomill config unset JpegCompression");
  AddFlag(app, "-n,--dry-run", options->dryRun, "Only show what would change");
}

void SetUpConfigPath(CLI::App& app, CommandContext& context) {
  SetUp(app, context, RunPath, TrLater("Print a JSON array of {path, exists}"),
        "fotomill config path");
}

}  // namespace fotomill::cli
