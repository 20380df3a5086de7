#include "desktop/models/files/uri_list.h"

#include <gmock/gmock.h>

#include "desktop/models/shell/start_argument.h"

namespace fotomill::desktop {
namespace {

using testing::ElementsAreArray;
using Strings = std::vector<std::string>;

TEST(UriList, AnyNameRoundTrips) {
  const struct {
    std::string path, uri;
  } rows[] = {
      {"/a/b-c_d.e~9", "file:///a/b-c_d.e~9"},
      {"/two words", "file:///two%20words"},
      {"/100%25#?&", "file:///100%2525%23%3F%26"},
      {"/caf\xC3\xA9", "file:///caf%C3%A9"},
      {"/caf\xE9", "file:///caf%E9"},
      {"/a\r\nb\x7F", "file:///a%0D%0Ab%7F"},
  };
  Strings paths;
  std::string list;
  for (const auto& row : rows) {
    EXPECT_EQ(UriOf(row.path), row.uri);
    paths.push_back(row.path);
    list += row.uri + "\r\n";
  }
  EXPECT_EQ(UriList(paths), list);
  EXPECT_THAT(PathsOfUriList(list), ElementsAreArray(paths));
}

TEST(UriList, ReadsOtherPrograms) {
  const struct {
    std::string list;
    Strings paths;
  } rows[] = {
      {"", {}},
      {"file:///a", {"/a"}},
      {"file:///a\nfile:///b\n", {"/a", "/b"}},
      {"#file:///a\r\nFILE://localhost/b%c3%A9\r\n", {"/b\xC3\xA9"}},
      {"file:/a", {"/a"}},
      {{"file:///a\0", 10}, {"/a"}},
      {"file://other/a\r\nhttp://x/a\r\nfile:\r\nfile://\r\nfile:a\r\n/a", {}},
      {"file:///a%", {}},
      {"file:///a%4", {}},
      {"file:///a%4g", {}},
      {"file:///a%00b", {}},
      {"file:///%41", {"/A"}},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.list);
    EXPECT_THAT(PathsOfUriList(row.list), ElementsAreArray(row.paths));
  }
}

TEST(StartArgument, NamesThatTheToolkitCannotRead) {
  const struct {
    Strings arguments;
    std::string parsed, expected;
  } rows[] = {
      {{}, "", ""},
      {{"a"}, "a", "a"},
      {{"--new-instance", "caf\xE9"}, "", "caf\xE9"},
      {{"--display", ":1", "caf\xE9"}, "", "caf\xE9"},
      {{"-\xE9"}, "", ""},
      {{"--", "-\xE9"}, "", "-\xE9"},
      {{"--help"}, "", ""},
  };
  for (const auto& row : rows) EXPECT_EQ(StartArgument(row.arguments, row.parsed), row.expected);
}

}  // namespace
}  // namespace fotomill::desktop
