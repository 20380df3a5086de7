#include "batch/external_program.h"

#include <gtest/gtest.h>

#include <filesystem>

#include "support/files.h"
#include "support/scoped_environment.h"

namespace fotomill::test {
namespace {

// Notes what is asked of it, and what the program had written by then.
class Host : public ExternalProgramHost {
 public:
  explicit Host(std::string out) : out_(std::move(out)) {}
  void ShowMessage(std::string_view text) override { log += "message: " + std::string(text); }
  void LeaveClipboardChain() override { log += "leave "; }
  void JoinClipboardChain() override { log += "join "; }
  void TakeFocus() override {
    log += "focus";
    written = std::filesystem::exists(out_) ? ReadText(out_) : "";
  }

  std::string log, written;

 private:
  const std::string out_;
};

TEST(ExternalProgram, IsStartedAndWaitedFor) {
  const TemporaryFolder folder;
  const std::string program = folder.Path("xdg-open"), out = folder.Path("out");
  const auto open = [&](uint32_t flags, Host& host) {
    const ScopedEnvironment path("PATH", folder.Path() + ":/usr/bin:/bin");
    return OpenWithExternalProgram(host, "/music/a b.wav", flags);
  };
  Host none(out);
  {
    const ScopedEnvironment path("PATH", folder.Path());
    EXPECT_EQ(OpenWithExternalProgram(none, "/music/a b.wav", 0), Status::UnsupportedFunction);
  }
  EXPECT_EQ(none.log,
            "message: The external player for the file type you selected cannot be found. Please "
            "consult the Fotomill "
            "Formats document for more information about the format in question.");

  WriteText(program, "#!/bin/sh\nsleep 0.2\nprintf '%s' \"$1\" >\"" + out + "\"\n");
  std::filesystem::permissions(program, std::filesystem::perms::owner_all);
  Host waits(out), goesOn(out);
  EXPECT_EQ(open(0, waits), Status::Ok);
  EXPECT_EQ(waits.log, "leave join focus");
  EXPECT_EQ(waits.written, "/music/a b.wav");
  std::filesystem::remove(out);
  EXPECT_EQ(open(kDoNotWait, goesOn), Status::Ok);
  EXPECT_EQ(goesOn.log, "leave join focus");
  EXPECT_EQ(goesOn.written, "");
  for (int i = 0; i < 200 && !std::filesystem::exists(out); ++i) (void)std::system("sleep 0.02");

  WriteText(program, "no program at all");
  Host broken(out);
  EXPECT_EQ(open(0, broken), Status::UnsupportedFunction);
  EXPECT_TRUE(broken.log.starts_with("leave join message: The external player")) << broken.log;
}

TEST(ExternalProgram, IsForMediaThatAreNotRead) {
  for (const char* name : {"a.wav", "b.MP3", "/x/c.mp4", "d.mid", "e.avi", "f.mov"})
    EXPECT_TRUE(NeedsExternalProgram(name)) << name;
  for (const char* name : {"a.gif", "b.png", "c.webp", "d.pcd", "e.jpg", "f.txt", "none", "g.abc"})
    EXPECT_FALSE(NeedsExternalProgram(name)) << name;
}

}  // namespace
}  // namespace fotomill::test
