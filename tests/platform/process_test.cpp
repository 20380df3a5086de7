#include "platform/process.h"

#include <gtest/gtest.h>
#include <signal.h>
#include <unistd.h>

#include <chrono>
#include <thread>

#include "platform/clock.h"
#include "platform/files.h"
#include "support/child.h"
#include "support/files.h"
#include "support/scoped_environment.h"

namespace fotomill::platform {
namespace {

using test::InChild;
using test::ReadText;
using test::ScopedEnvironment;
using test::TemporaryFolder;
using test::WriteText;

TEST(Clock, CanBeFixed) {
  EXPECT_GT(Now(), 1'600'000'000);
  FixNow(1234);
  EXPECT_EQ(Now(), 1234);
  FixNow(-1);
  EXPECT_GT(Now(), 1'600'000'000);
  const double before = MonotonicSeconds();
  EXPECT_GE(MonotonicSeconds(), before);
}

TEST(Clock, ReturnsLocalTime) {
  const ScopedEnvironment zone("TZ", "XYZ-2");
  tzset();
  const LocalTime time = LocalTimeOf(951782399);  // 2000-02-28 23:59:59 UTC
  EXPECT_EQ(time.year * 10000 + time.month * 100 + time.day, 20000229);
  EXPECT_EQ(time.hour * 10000 + time.minute * 100 + time.second, 15959);
  EXPECT_EQ(time.weekday, 2);
  EXPECT_EQ(LocalTimeOf(INT64_MAX).month, 0);
}

// A program that writes its arguments to `out`, one per line.
std::string ArgumentPrinter(const TemporaryFolder& folder, const std::string& out) {
  const std::string path = folder.Path("printer");
  WriteText(path, "#!/bin/sh\nprintf '%s\\n' \"$@\" >'" + out + ".part'\nmv '" + out + ".part' '" +
                      out + "'\n");
  std::filesystem::permissions(path, std::filesystem::perms::owner_all);
  return path;
}

TEST(Process, PassesArgumentsUnchanged) {
  const TemporaryFolder folder;
  const std::string out = folder.Path("out");
  const std::string printer = ArgumentPrinter(folder, out);
  ASSERT_TRUE(RunProgram({printer, "a b", "$HOME", "`id`;'\"", "*", "", "\xFF"}, true));
  EXPECT_EQ(ReadText(out), "a b\n$HOME\n`id`;'\"\n*\n\n\xFF\n");

  const ScopedEnvironment path("PATH", "relative::" + folder.Path() + ":/usr/bin:/bin");
  ASSERT_TRUE(RunProgram({"printer", "found"}, true));
  EXPECT_EQ(ReadText(out), "found\n");
  ASSERT_TRUE(DeleteFile(out));
  ASSERT_TRUE(RunProgram({"printer", "later"}, false));
  for (int i = 0; i < 2000 && !FileExists(out); ++i)
    std::this_thread::sleep_for(std::chrono::milliseconds(5));
  EXPECT_EQ(ReadText(out), "later\n");
}

TEST(Process, RejectsNonPrograms) {
  const TemporaryFolder folder;
  WriteText(folder.Path("text"), "#!/bin/sh\n");
  WriteText(folder.Path("garbage"), "no program at all");
  std::filesystem::permissions(folder.Path("garbage"), std::filesystem::perms::owner_all);
  const ScopedEnvironment path("PATH", folder.Path() + ":.");
  for (const char* name : {"", "text", "garbage", "missing", "/", "."})
    EXPECT_FALSE(RunProgram({name}, true)) << name;
  EXPECT_FALSE(RunProgram({}, true));
  EXPECT_TRUE(ProgramFor("a.bmp").empty());
  WriteText(folder.Path("xdg-open"), "#!/bin/sh\n");
  std::filesystem::permissions(folder.Path("xdg-open"), std::filesystem::perms::owner_all);
  EXPECT_EQ(ProgramFor("/-a\n.bmp"), (std::vector<std::string>{folder.Path("xdg-open"), "/-a\n.bmp"}));
}

TEST(Process, TheSecondTerminationRequestEndsTheProgram) {
  for (const int number : {SIGINT, SIGTERM}) {
    const int once = InChild([number] {
      CatchTermination();
      if (PendingExit() != 0) _exit(99);
      raise(number);
      _exit(PendingExit());
    });
    EXPECT_TRUE(WIFEXITED(once));
    EXPECT_EQ(WEXITSTATUS(once), 128 + number);
    const int twice = InChild([number] {
      CatchTermination();
      raise(SIGINT);
      raise(number);
    });
    EXPECT_TRUE(WIFSIGNALED(twice));
    EXPECT_EQ(WTERMSIG(twice), number);
    const int ignored = InChild([number] {
      signal(number, SIG_IGN);
      CatchTermination();
      raise(number);
      _exit(PendingExit());
    });
    EXPECT_TRUE(WIFEXITED(ignored));
    EXPECT_EQ(WEXITSTATUS(ignored), 0);
  }
}

TEST(Process, MachineFacts) {
  EXPECT_GE(CoreCount(), 1u);
  EXPECT_FALSE(IsTerminal(99));
  EXPECT_GT(TerminalWidth(), 0);
}

}  // namespace
}  // namespace fotomill::platform
