#include <gtest/gtest.h>

#include <algorithm>
#include <set>
#include <thread>

#include "core/data_folder.h"
#include "desktop/models/view/animation_player.h"
#include "desktop/models/view/slideshow.h"
#include "support/files.h"
#include "support/hex.h"

namespace fotomill::desktop {
namespace {

// A 1 x 1 GIF whose frames have these delays in hundredths of a second, alternating black and
// white. `repeats` below 0: it does not loop.
std::vector<uint8_t> Gif(const std::vector<int>& delays, int repeats) {
  std::string text = "474946383961 0100 0100 80 00 00 000000 FFFFFF ";
  const auto word = [](int value) {
    char hex[16];
    std::snprintf(hex, sizeof hex, "%02X%02X ", static_cast<unsigned>(value & 255),
                  static_cast<unsigned>(value >> 8 & 255));
    return std::string(hex);
  };
  if (repeats >= 0) text += "21 FF 0B 4E45545343415045322E30 03 01 " + word(repeats) + "00 ";
  for (size_t i = 0; i < delays.size(); ++i) {
    text += "21 F9 04 00 " + word(delays[i]) + "00 00 2C 0000 0000 0100 0100 00 02 02 ";
    text += i % 2 == 0 ? "4401 00 " : "4C01 00 ";
  }
  return test::Hex(text + "3B");
}

class Player {
 public:
  Player(const std::vector<uint8_t>& file, uint64_t capacity) {
    test::WriteBytes(folder_.Path("a.gif"), file);
    player_ = std::make_unique<AnimationPlayer>(ViewRequest{folder_.Path("a.gif"), 0, 0, 0},
                                                capacity, [] {});
  }
  AnimationPlayer* operator->() { return player_.get(); }

  // Lets the decoder finish, then requests the frame: its number and the blue of its
  // pixel, as "2:FF".
  std::string At(double now) {
    ViewPicturePointer picture;
    for (int wait = 0; wait < 2000 && (player_->Failure() == Status::Ok || player_->Count() > 0) &&
                       (picture == nullptr || (player_->Playing() && player_->SecondsLeft(now) < 0));
         ++wait) {
      picture = player_->At(now);
      std::this_thread::sleep_for(std::chrono::milliseconds(1));
    }
    if (picture == nullptr) return "none";
    return std::to_string(player_->Frame()) +
           (picture->picture->image.Row(0)[0] == 0 ? ":black" : ":white");
  }

 private:
  test::TemporaryFolder folder_;
  std::unique_ptr<AnimationPlayer> player_;
};

struct Moment {
  double seconds;
  const char* frame;
};

TEST(AnimationPlayer, ShowsEachFrameForItsTime) {
  struct Row {
    const char* name;
    std::vector<uint8_t> file;
    std::vector<Moment> moments;
    bool plays;
  };
  const Row rows[] = {
      {"for ever",
       Gif({10, 20, 50}, 0),
       {{5, "0:black"},
        {5.09, "0:black"},
        {5.1, "1:white"},
        {5.29, "1:white"},
        {5.31, "2:black"},
        {5.801, "0:black"},
        {5.9, "1:white"}},
       true},
      {"two rounds",
       Gif({10, 10}, 1),
       {{0, "0:black"}, {0.1, "1:white"}, {0.2, "0:black"}, {0.31, "1:white"}, {0.5, "1:white"}},
       false},
      {"no loop", Gif({10, 10}, -1), {{0, "0:black"}, {0.1, "1:white"}, {0.2, "1:white"}}, false},
      {"no delay is 100 ms, 20 ms are kept",
       Gif({0, 1, 2}, 0),
       {{0, "0:black"}, {0.0999, "0:black"}, {0.1, "1:white"}, {0.1999, "1:white"}, {0.2, "2:black"}, {0.22, "0:black"}},
       true},
      {"late, it shows every frame and does not hurry",
       Gif({10, 10, 10}, 0),
       {{0, "0:black"}, {0.95, "1:white"}, {1.04, "1:white"}, {1.05, "2:black"}},
       true},
      {"one frame", Gif({10}, 0), {{0, "0:black"}, {0.2, "0:black"}}, false},
  };
  // all frames cached, or two of them
  for (const uint64_t capacity : {uint64_t{1} << 28, uint64_t{0}}) {
    for (const Row& row : rows) {
      SCOPED_TRACE(row.name);
      Player player(row.file, capacity);
      player->Play();
      for (const Moment& moment : row.moments)
        EXPECT_EQ(player.At(moment.seconds), moment.frame) << moment.seconds;
      EXPECT_EQ(player->Playing(), row.plays);
      EXPECT_EQ(player->PlayedOnce(), row.moments.back().seconds > 0.11 &&
                                          std::string(row.name).find("late") == std::string::npos);
    }
  }
}

TEST(AnimationPlayer, PausesStepsAndResumes) {
  for (const uint64_t capacity : {uint64_t{1} << 28, uint64_t{0}}) {
    Player player(Gif({10, 10, 10, 10}, -1), capacity);
    EXPECT_EQ(player.At(0), "0:black");  // does not start by itself
    EXPECT_EQ(player.At(9), "0:black");
    player->Step(1);
    EXPECT_EQ(player.At(9), "1:white");
    player->Step(-2);
    EXPECT_EQ(player.At(9), "3:white");
    player->Step(-1);
    player->Play();
    EXPECT_EQ(player.At(10), "2:black");
    EXPECT_EQ(player.At(10.1), "3:white");
    player->Pause();
    EXPECT_LT(player->SecondsLeft(10.1), 0);
    EXPECT_EQ(player.At(20), "3:white");
    player->Play();
    EXPECT_EQ(player.At(20), "3:white");
    EXPECT_EQ(player.At(20.1), "3:white");  // the end of the only loop
    EXPECT_FALSE(player->Playing());
    player->Play();
    EXPECT_EQ(player.At(21), "0:black");
  }
}

TEST(AnimationPlayer, EndsAtDamagedData) {
  std::vector<uint8_t> file = Gif({10, 10, 10}, 0);
  file.resize(file.size() - 4);  // within the pixels of the last frame
  Player player(file, 1 << 20);
  player->Play();
  for (const Moment& moment :
       {Moment{0, "0:black"}, {0.1, "1:white"}, {0.2, "0:black"}, {0.31, "1:white"}}) {
    EXPECT_EQ(player.At(moment.seconds), moment.frame);
  }
  EXPECT_EQ(player->Count(), 2u);
  EXPECT_EQ(player->Failure(), Status::FileReadError);
  Player none(test::Hex("474946383961 0100 0100 80 00 00 000000 FFFFFF 3B"), 1 << 20);
  EXPECT_EQ(none.At(0), "none");
  EXPECT_TRUE(none->PlayedOnce());
  std::vector<uint8_t> huge = Gif({10, 10}, 0);
  huge[7] = huge[9] = 40;  // a screen of 10241 by 10241
  Player tooLarge(huge, 1 << 20);
  EXPECT_EQ(tooLarge.At(0), "none");
  EXPECT_EQ(tooLarge->Failure(), Status::MemoryAllocationError);
}

std::vector<size_t> Order(const SlideshowChoices& choices, size_t count, size_t place,
                          size_t steps) {
  Slideshow show(choices, count, place, 1);
  std::vector<size_t> order{place};
  for (; steps > 0; --steps) {
    const auto next = show.Next(order.back(), count);
    if (!next) break;
    order.push_back(*next);
  }
  return order;
}

TEST(Slideshow, ChoicesAreKept) {
  const test::TemporaryFolder folder;
  const std::string before = DataFolder();
  SetDataFolder(folder.Path());
  EXPECT_EQ(LoadSlideshowChoices(), SlideshowChoices());
  const SlideshowChoices choices{9, true, false};
  EXPECT_TRUE(SaveSlideshowChoices(choices));
  EXPECT_EQ(LoadSlideshowChoices(), choices);
  test::WriteText(folder.Path("FMWSlideshow.txt"), "[Slideshow]\nSeconds=0\nRandom=x\nRepeat=0\n");
  EXPECT_EQ(LoadSlideshowChoices(), (SlideshowChoices{.repeat = false}));
  SetDataFolder(before);
}

TEST(Slideshow, VisitsTheList) {
  using Places = std::vector<size_t>;
  EXPECT_EQ(Order({.repeat = true}, 3, 1, 4), (Places{1, 2, 0, 1, 2}));
  EXPECT_EQ(Order({.repeat = false}, 3, 1, 4), (Places{1, 2}));
  EXPECT_EQ(Order({.random = true, .repeat = true}, 1, 0, 2), (Places{0, 0, 0}));
  // Random: each index once in every round, never twice in a row.
  Places once = Order({.random = true, .repeat = false}, 20, 7, 100);
  EXPECT_FALSE(std::ranges::is_sorted(once));
  EXPECT_EQ(once.front(), 7u);
  std::ranges::sort(once);
  for (size_t i = 0; i < 20; ++i) EXPECT_EQ(once[i], i);
  const Places rounds = Order({.random = true, .repeat = true}, 5, 2, 499);
  for (size_t i = 0; i + 5 <= rounds.size(); i += 5) {
    EXPECT_EQ(std::set(rounds.begin() + static_cast<long>(i), rounds.begin() + static_cast<long>(i) + 5).size(), 5u);
  }
  EXPECT_EQ(std::ranges::adjacent_find(rounds), rounds.end());
  Slideshow shrinking({.random = true, .repeat = false}, 9, 0, 1);
  EXPECT_LT(shrinking.Next(1, 3), 3u);  // files were deleted
}

}  // namespace
}  // namespace fotomill::desktop
