#include "platform/shared_library.h"

#include <gtest/gtest.h>
#include <sys/stat.h>

#include <sstream>

#include "support/faults.h"
#include "support/files.h"

namespace fotomill::platform {
namespace {

namespace fs = std::filesystem;
using test::TemporaryFolder;

// The path of a library that this process has loaded.
std::string LoadedFile(std::string_view name) {
  std::istringstream maps(test::ReadText("/proc/self/maps"));
  for (std::string line; std::getline(maps, line);) {
    const size_t start = line.find('/');
    if (start != std::string::npos && line.find(name, start) != std::string::npos)
      return line.substr(start);
  }
  return {};
}

TEST(SharedLibrary, LoadsModulesByAbsolutePath) {
  const TemporaryFolder folder;
  const std::string module = folder.Path("FMWPL module.so");
  fs::copy_file(LoadedFile("/libm.so"), module);
  fs::create_symlink("FMWPL module.so", folder.Path("link.so"));
  SharedLibrary library;
  ASSERT_TRUE(library.Load(module)) << library.Error();
  using Cosine = double(double);
  Cosine* cosine = library.FunctionNamed<Cosine>("cos");
  ASSERT_NE(cosine, nullptr);
  EXPECT_EQ(cosine(0), 1);
  EXPECT_EQ(library.Symbol("no_such_name"), nullptr);
  EXPECT_NE(LoadedFile("FMWPL module.so"), "");
  SharedLibrary moved = std::move(library);
  EXPECT_FALSE(library.Loaded());
  EXPECT_EQ(library.Symbol("cos"), nullptr);
  EXPECT_TRUE(moved.Loaded());
  moved.Unload();
  EXPECT_EQ(LoadedFile("FMWPL module.so"), "");
  EXPECT_TRUE(moved.Load(folder.Path("link.so")));
}

TEST(SharedLibrary, RejectsNonModules) {
  const TemporaryFolder folder;
  test::WriteText(folder.Path("text.so"), "no module");
  test::WriteText(folder.Path("empty.so"), "");
  fs::create_directory(folder.Path("folder.so"));
  ASSERT_EQ(mkfifo(folder.Path("fifo.so").c_str(), 0600), 0);
  SharedLibrary library;
  const std::string paths[] = {folder.Path("text.so"),
                               folder.Path("empty.so"),
                               folder.Path("folder.so"),
                               folder.Path("fifo.so"),
                               folder.Path("missing"),
                               fs::path(LoadedFile("/libm.so")).filename(),
                               "./text.so",
                               ""};
  for (const std::string& path : paths) {
    EXPECT_FALSE(library.Load(path)) << path;
    EXPECT_NE(library.Error(), "") << path;
    EXPECT_FALSE(library.Loaded()) << path;
  }
  for (const std::string& name :
       {std::string(), std::string("libno-such.so.9"), LoadedFile("/libm.so")}) {
    EXPECT_FALSE(library.LoadSystem(name)) << name;
    EXPECT_NE(library.Error(), "") << name;
  }
  EXPECT_TRUE(library.LoadSystem(fs::path(LoadedFile("/libm.so")).filename()));
  EXPECT_EQ(library.Error(), "");
  EXPECT_EQ(test::ForEachFault([&] {
              const bool loaded = library.Load(LoadedFile("/libm.so"));
              EXPECT_EQ(loaded, faultCountdown > 0);
            }),
            1);
}

}  // namespace
}  // namespace fotomill::platform
