#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "cli/frame/command.h"
#include "cli/frame/commands.h"
#include "cli/frame/shown_text.h"
#include "core/shown_text.h"
#include "core/utf8.h"
#include "support/command_line.h"
#include "support/scoped_environment.h"

namespace fotomill::test {
namespace {

using testing::HasSubstr;
using testing::IsEmpty;

TEST(Frame, ExitStatusesAndMessages) {
  const struct {
    const char* name;
    std::vector<std::string> arguments;
    int status;
    const char* out;  // must be contained
    const char* err;
  } rows[] = {
      {"no command", {}, 2, "", "Usage: fotomill"},
      {"options only", {"--quiet"}, 2, "", "No command given."},
      {"unknown command", {"convrt", "x.bmp"}, 2, "", "Unknown command \"convrt\". Did you mean \"convert\"?"},
      {"unknown command, nothing near", {"xyzzy"}, 2, "", "Unknown command \"xyzzy\".\n"},
      {"a known synonym", {"resize", "x.bmp"}, 2, "", "Unknown command \"resize\". Did you mean \"apply\"?"},
      {"the only command that begins so", {"verif"}, 2, "", "Did you mean \"verify\"?"},
      {"two edits are no hint", {"vrefiy"}, 2, "", "Unknown command \"vrefiy\".\n"},
      {"many begin so", {"con"}, 2, "", "Unknown command \"con\".\n"},
      {"a format by another name", {"convert", "-t", "jxr", "a.bmp"}, 2, "", "Unknown format \"jxr\". Did you mean \"hdp\"?"},
      {"a format like none", {"convert", "-t", "xyz", "a.bmp"}, 2, "", "Unknown format \"xyz\".\n"},
      {"an option by another name", {"convert", "--output", "x", "a.bmp"}, 2, "", "Did you mean \"--out\"?"},
      {"a flag with a value", {"match", "--json=yes", "a.bmp"}, 2, "", "match: --json takes no value.\n"},
      {"a value behind a short flag", {"convert", "-q5", "a.bmp"}, 2, "", "convert: Unknown option \"-5\".\n"},
      {"a name behind two dashes", {"match", "--", "-5.bmp"}, 0, "BMP", ""},
      {"verbose and quiet", {"match", "-v", "-q", "a.bmp"}, 0, "BMP", ""},
      {"what is required", {"help", "tdb", "find"}, 0, "Thumbnail file to write (required)", ""},
      {"the words of a choice", {"help", "turn"}, 0, "left", ""},
      {"the limits of a number", {"help", "thumbs", "draw"}, 0, "(1 to 4096)", ""},
      {"unknown option", {"match", "--jsn", "a.bmp"}, 2, "", "match: Unknown option \"--jsn\". Did you mean \"--json\"?"},
      {"unknown short option", {"match", "-z", "a.bmp"}, 2, "", "Unknown option \"-z\"."},
      {"unknown option before the command", {"--bogus", "match", "a.bmp"}, 2, "", "Unknown option \"--bogus\"."},
      {"missing name", {"match"}, 2, "", "match: NAME... is missing."},
      {"one name too many", {"formats", "x"}, 2, "", "Unexpected argument \"x\"."},
      {"option that lacks its value", {"match", "--data"}, 2, "", "match: --data needs a value."},
      {"value not offered", {"--color", "blue", "match", "a.bmp"}, 2, "", "--color: \"blue\" is not one of auto, always, never"},
      {"empty folder", {"--data=", "match", "a.bmp"}, 2, "", "--data: is empty"},
      {"no number", {"convert", "-t", "pcx", "--page", "x", "a.bmp"}, 2, "", "--page: \"x\" is neither all nor a whole number of at least 1."},
      {"number out of range", {"convert", "-t", "pcx", "--quality", "101", "a.bmp"}, 2, "", "--quality: \"101\" is neither keep nor a whole number from 1 to 100."},
      {"option given twice", {"convert", "-t", "pcx", "-t", "bmp", "a.bmp"}, 2, "", "--to was given twice."},
      {"missing option", {"tdb", "find", "a.tdb", "a.bmp"}, 2, "", "--out is missing."},
      {"two values", {"exif", "--distance", "1,2"}, 2, "", "--distance needs 2 values."},
      {"no files", {"info"}, 2, "", "No files given."},
      {"options that exclude each other", {"formats", "--json", "--filter"}, 2, "", "--json and --filter cannot be combined."},
      {"version", {"--version"}, 0, "Fotomill Professional 11.0.16\nCLI11 ", ""},
      {"short version", {"-V"}, 0, "nlohmann-json ", ""},
      {"version as JSON", {"--version", "--json"}, 0, "\"name\": \"CLI11\"", ""},
      {"licenses", {"--licenses", "-V", "-q"}, 0, ": BSD-3-Clause\n  Copyright 2017", ""},
      {"version with an unknown option", {"--version", "--licences"}, 2, "", "Unknown option \"--licences\"."},
      {"version before a command", {"--version", "convert"}, 0, "CLI11 ", ""},
      {"licenses without version", {"--licenses"}, 2, "", "Unknown option \"--licenses\"."},
      {"help lists topics", {"help"}, 0, "\n  exit-status ", ""},
      {"topic of exit statuses", {"help", "exit-status"}, 0, "\n  130, 143  Stopped by SIGINT or SIGTERM.\n", ""},
      {"topic of JSON", {"help", "json"}, 0, "  Print a JSON array of {file, thumbnail, status}\n", ""},
      {"topic of recipes", {"help", "recipes"}, 0, "\n  annotate   caption, text\n", ""},
      {"topic of names", {"help", "names"}, 0, "\n  %E{Tag}  text of an EXIF tag", ""},
      {"topic that is not", {"help", "exit-statu"}, 2, "", "Did you mean \"exit-status\"?"},
      {"help", {"--help"}, 0, "convert", ""},
      {"help of a command", {"help", "convert"}, 0, "Example: fotomill convert", ""},
      {"help of a command that is not", {"help", "convrt"}, 2, "", "Did you mean \"convert\"?"},
      {"-h of a command without its names", {"info", "-h"}, 0, "Example: fotomill info", ""},
      {"help is no mistake beside one", {"help"}, 0, "Usage: fotomill", ""},
      {"command after global options", {"--color", "never", "--data", "d", "match", "a.bmp"}, 0, "BMP", ""},
      {"global options after it", {"match", "a.bmp", "-q", "--no-input", "--no-plugins"}, 0, "BMP", ""},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.name);
    const CommandResult result = RunCommand(row.arguments);
    EXPECT_EQ(result.status, row.status);
    EXPECT_THAT(result.out, HasSubstr(row.out));
    EXPECT_THAT(result.err, HasSubstr(row.err));
    EXPECT_THAT(row.status == 2 ? result.out : result.err, IsEmpty());
  }
}

// Names are passed through byte for byte, whatever they look like.
TEST(Frame, PrintsNamesUnchanged) {
  for (const std::string name :
       {"[a,b].bmp", "[x]", "{}", "%%", "", " ", "a\nb.bmp", "\xff\xfe.bmp", "--", "-x.bmp",
        "--json", "a=b", "++", "/?", "match", "-5", "\"quoted\""}) {
    SCOPED_TRACE(name);
    const CommandResult result = RunCommand({"match", "--", name, "end.bmp"});
    EXPECT_THAT(result.out, testing::StartsWith(name + ": "));
    EXPECT_THAT(result.out, HasSubstr("\nend.bmp: BMP"));
  }
}

TEST(Frame, EveryCommandHasAPageWithAnExample) {
  for (const cli::Command& command : cli::Commands()) {
    SCOPED_TRACE(command.name);
    const std::string name = command.name;
    const CommandResult page = RunCommand({"help", name});
    EXPECT_EQ(page.status, 0);
    EXPECT_THAT(page.out, HasSubstr("Usage: fotomill " + name));
    EXPECT_THAT(page.out, HasSubstr("Example"));
    EXPECT_THAT(page.out, HasSubstr("--help"));
  }
}

TEST(Frame, UnwritableOutputFails) {
  std::FILE* full = std::fopen("/dev/full", "w");
  if (full == nullptr) GTEST_SKIP() << "no device that is always full";
  std::FILE* messages = std::tmpfile();
  const char* arguments[] = {"fotomill", "formats", "--json"};
  EXPECT_EQ(cli::RunCommandLine(3, arguments, {stdin, full, messages}), 1);
  std::fclose(full);
  std::fclose(messages);
}

TEST(Frame, ColorDependsOnOptionTerminalAndEnvironment) {
  const struct {
    const char* name;
    std::vector<std::string> options;
    bool terminal;
    const char* noColor;
    bool colored;
    const char* term = "xterm";
  } rows[] = {
      {"pipe", {}, false, nullptr, false},
      {"terminal", {}, true, nullptr, true},
      {"terminal without colors", {}, true, nullptr, false, "dumb"},
      {"NO_COLOR", {}, true, "1", false},
      {"NO_COLOR empty", {}, true, "", true},
      {"never", {"--color=never"}, true, nullptr, false},
      {"always", {"--color=always"}, false, "1", true},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.name);
    const ScopedEnvironment term("TERM", row.term);
    const ScopedEnvironment noColor("NO_COLOR", row.noColor);
    std::vector<std::string> arguments{"info", "/missing.bmp"};
    arguments.insert(arguments.end(), row.options.begin(), row.options.end());
    const CommandResult result = RunCommand(arguments, {.interactive = row.terminal});
    EXPECT_EQ(result.err.find('\x1b') != std::string::npos, row.colored) << result.err;
  }
}

TEST(ShownText, ControlsAndBrokenUtf8AreEscaped) {
  const struct {
    const char* text;
    const char* shown;
    bool utf8;
  } rows[] = {
      {"plain \\ name", "plain \\ name", true},
      {"a\nb\tc\rd", "a\\nb\\tc\\rd", true},
      {"\x1b[31m\x7f", "\\x1B[31m\\x7F", true},
      {"gr\xc3\xbc\xc3\x9f \xe2\x82\xac \xf0\x9f\x98\x80", "gr\xc3\xbc\xc3\x9f \xe2\x82\xac \xf0\x9f\x98\x80", true},
      {"\xc2\x9b"
       "31m",
       "\\xC2\\x9B31m", true},  // 8-bit control sequence introducer
      {"\x9b", "\\x9B", false},
      {"\xc0\xaf", "\\xC0\\xAF", false},           // overlong form
      {"\xed\xa0\x80", "\\xED\\xA0\\x80", false},  // a surrogate
      {"\xf4\x90\x80\x80", "\\xF4\\x90\\x80\\x80", false},
      {"cut \xe2\x82", "cut \\xE2\\x82", false},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.shown);
    EXPECT_EQ(EscapeControls(row.text), row.shown);
    EXPECT_EQ(IsUtf8(row.text), row.utf8);
  }
}

TEST(ShownText, Base64OfEveryRemainder) {
  EXPECT_EQ(cli::Base64(""), "");
  EXPECT_EQ(cli::Base64("f"), "Zg==");
  EXPECT_EQ(cli::Base64("fo"), "Zm8=");
  EXPECT_EQ(cli::Base64("foo"), "Zm9v");
  EXPECT_EQ(cli::Base64("\xff\xfe\xfd\xfc"), "//79/A==");
}

}  // namespace
}  // namespace fotomill::test
