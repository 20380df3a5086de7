#include "registry/about.h"

#include <gtest/gtest.h>

#include <set>
#include <string>

namespace fotomill {
namespace {

const Library* Find(const std::vector<Library>& libraries, const std::string& name) {
  for (const Library& library : libraries) {
    if (library.name == name) return &library;
  }
  return nullptr;
}

// A linked library missing in the table is listed last, without a license.
TEST(About, EveryLinkedLibraryHasALicense) {
  std::set<std::string> names;
  for (const Library& library : LibrariesOf({})) {
    SCOPED_TRACE(library.name);
    EXPECT_STRNE(library.license, "");
    EXPECT_STRNE(library.copyright, "");
    EXPECT_STRNE(library.purpose, "");
    EXPECT_TRUE(names.insert(library.name).second);
    EXPECT_TRUE(library.present || library.linking == Linking::Loaded);
  }
  for (const char* name : {"libjpeg-turbo", "libpng", "zlib", "libtiff", "libwebp", "lcms2",
                           "FreeType", "FriBidi", "libdeflate", "HarfBuzz", "LibRaw"})
    EXPECT_EQ(names.count(name), 1u) << name;
}

TEST(About, IncludesLibrariesOfTheFrontEnd) {
  EXPECT_EQ(Find(LibrariesOf({}), "wxWidgets"), nullptr);
  const OwnLibrary own[] = {{"wxWidgets", "3.2.9", Linking::Shared},
                            {"libstdc++", "12.2.0", Linking::Inside}};
  const std::vector<Library> libraries = LibrariesOf(own);
  ASSERT_NE(Find(libraries, "wxWidgets"), nullptr);
  EXPECT_EQ(Find(libraries, "wxWidgets")->version, "3.2.9");
  EXPECT_EQ(Find(libraries, "wxWidgets")->linking, Linking::Shared);
  EXPECT_EQ(Find(libraries, "libstdc++")->linking, Linking::Inside);
  EXPECT_EQ(libraries.size(), LibrariesOf({}).size() + 2);
}

}  // namespace
}  // namespace fotomill
