#include "desktop/models/shell/key_map.h"

#include <gtest/gtest.h>

namespace fotomill::desktop {
namespace {

const std::vector<KeyedCommand> kCommands = {
    {"File/Open", "Open", "Ctrl+O"}, {"Edit/Copy", "Copy", "Ctrl+C"}, {"View/List", "List", ""}};

TEST(KeyMap, AKeyBelongsToOneCommand) {
  const KeyedCommand &open = kCommands[0], &copy = kCommands[1], &list = kCommands[2];
  KeyMap keys;
  EXPECT_EQ(keys.KeyOf(open), "Ctrl+O");
  EXPECT_EQ(keys.Conflict(kCommands, list, "ctrl+o")->name, "File/Open");
  EXPECT_EQ(keys.Conflict(kCommands, open, "Ctrl+O"), nullptr);
  EXPECT_EQ(keys.Conflict(kCommands, open, ""), nullptr);
  keys.Assign(kCommands, list, "Ctrl+O");
  EXPECT_EQ(keys.KeyOf(open), "");
  EXPECT_EQ(keys.KeyOf(list), "Ctrl+O");
  EXPECT_EQ(keys.KeyOf(copy), "Ctrl+C");
  EXPECT_EQ(keys.Text(), "File/Open=\nView/List=Ctrl+O\n");
  EXPECT_EQ(KeyMap::Parse(keys.Text()), keys);
  // Back to its own key, which is taken from the other command again.
  keys.Assign(kCommands, open, open.builtIn);
  EXPECT_TRUE(keys.IsBuiltIn(open));
  EXPECT_EQ(keys.KeyOf(list), "");
  EXPECT_EQ(keys, KeyMap());
}

TEST(KeyMap, IgnoresWhatCannotBeAKey) {
  const KeyMap keys = KeyMap::Parse("=Ctrl+A\nno key\r\nFile/Open=a\nEdit/Copy=Alt+1\r\n");
  EXPECT_EQ(keys.Text(), "Edit/Copy=Alt+1\n");
  for (const char* key : {"Ctrl+A", "Alt+1", "F5", "Shift+F2", "Del", "Ctrl++", "Ctrl+Shift+C",
                          "Ctrl+Num +", "Alt+Left", "Ctrl+Page Down"})
    EXPECT_TRUE(MayBeKey(key)) << key;
  for (const char* key : {"", "a", "+", "Shift+A", "5", "Ctrl+", "Shift+", "\xC3\xA4", "Win+A",
                          "Left", "Shift+Page Down", "Space", "Enter", "Tab", "Shift+Back"})
    EXPECT_FALSE(MayBeKey(key)) << key;
}

TEST(KeyMap, AKeyIsTheSameByAnyName) {
  const std::vector<KeyedCommand> commands = {
      {"a", "A", "Ctrl+Return"}, {"b", "B", "Ctrl+PageDown"}, {"c", "C", "Ctrl+Shift+N"},
      {"d", "D", "Delete"},      {"e", "E", "Ctrl++"},        {"f", "F", ""}};
  const struct {
    const char *key, *conflict;
  } rows[] = {{"Ctrl+Enter", "a"}, {"Ctrl+Page Down", "b"}, {"shift+ctrl+n", "c"}, {"Del", "d"},
              {"Ctrl++", "e"},     {"Ctrl+Num +", ""},      {"Ctrl+N", ""}};
  KeyMap keys;
  for (const auto& row : rows) {
    const KeyedCommand* const other = keys.Conflict(commands, commands.back(), row.key);
    EXPECT_EQ(other == nullptr ? "" : other->name, row.conflict) << row.key;
  }
  keys.Assign(commands, commands[0], "Ctrl+Enter");
  EXPECT_TRUE(keys.IsBuiltIn(commands[0]));
}

}  // namespace
}  // namespace fotomill::desktop
