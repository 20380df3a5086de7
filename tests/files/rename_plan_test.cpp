#include "files/rename_plan.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <algorithm>
#include <map>
#include <numeric>
#include <random>
#include <set>

namespace fotomill::test {
namespace {

using testing::IsEmpty;

std::string Spare(const std::string& path) { return path + "~"; }

// The steps as "a>b c>d"; a group of several in brackets.
std::string PlanText(const std::vector<RenamedFile>& files) {
  std::string text;
  for (const RenameGroup& group : PlanRenames(files, Spare)) {
    text += text.empty() ? "" : " ";
    for (const RenameStep& step : group)
      text += (&step == &group[0] ? group.size() > 1 ? "(" : "" : " ") + step.from + ">" + step.to;
    text += group.size() > 1 ? ")" : "";
  }
  return text;
}

TEST(RenamePlan, FreesNamesBeforeTheyAreNeeded) {
  const struct {
    std::vector<RenamedFile> files;
    const char* plan;
  } rows[] = {
      {{}, ""},
      {{{"a", "x"}, {"b", "y"}}, "a>x b>y"},
      {{{"a", "b"}, {"b", "c"}, {"c", "d"}}, "c>d b>c a>b"},
      {{{"b", "c"}, {"a", "b"}}, "b>c a>b"},
      {{{"a", "b"}, {"b", "a"}}, "(a>a~ b>a a~>b)"},
      {{{"a", "b"}, {"b", "c"}, {"c", "a"}, {"x", "y"}}, "(a>a~ c>a b>c a~>b) x>y"},
      {{{"a", "n"}, {"b", "n"}, {"c", "b"}}, "a>n c>b b>n"},
  };
  for (const auto& row : rows) EXPECT_EQ(PlanText(row.files), row.plan);
}

// Any permutation, with some names outside it, ends with each file under its new name, and
// RenamesToUndo of its steps leads back.
TEST(RenamePlan, CarriesOutAnyPermutation) {
  std::mt19937 numbers(7);
  for (int round = 0; round < 200; ++round) {
    std::vector<int> names(12);
    std::iota(names.begin(), names.end(), 0);
    std::shuffle(names.begin(), names.end(), numbers);
    std::vector<RenamedFile> files;
    std::map<std::string, int> disk;
    for (int i = 0; i < 8; ++i) {
      disk[std::to_string(i)] = i;
      if (names[i] != i) files.push_back({std::to_string(i), std::to_string(names[i])});
    }
    for (const int name : names) {
      const bool target = std::ranges::any_of(
          files, [&](const RenamedFile& file) { return file.to == std::to_string(name); });
      if (!target && name >= 8) disk[std::to_string(name)] = name;
    }
    const auto before = disk;
    std::vector<RenamedFile> steps;
    const auto carryOut = [&](const std::vector<RenamedFile>& wanted) {
      for (const RenameGroup& group : PlanRenames(wanted, Spare)) {
        for (const RenameStep& step : group) {
          ASSERT_FALSE(disk.contains(step.to)) << step.to;
          disk[step.to] = disk.at(step.from);
          disk.erase(step.from);
          steps.push_back({step.from, step.to});
        }
      }
    };
    carryOut(files);
    for (const RenamedFile& file : files) EXPECT_EQ(disk.at(file.to), std::stoi(file.from));
    EXPECT_EQ(disk.size(), before.size());
    const auto exists = [&](const std::string& name) { return disk.contains(name); };
    std::vector<RenamedFile> back;
    for (const RenamedFile& file : RenamesToUndo(steps, exists))
      back.push_back({file.to, file.from});
    carryOut(back);
    EXPECT_EQ(disk, before);
    EXPECT_THAT(RenamesToUndo(steps, exists), IsEmpty()) << "all is undone";
  }
}

// A run that was ended between or within steps of "a" and "b" exchanging their names.
TEST(RenamePlan, KnowsWhatHappenedBeforeAnEnd) {
  const std::vector<RenamedFile> steps = {{"a", "a~"}, {"b", "a"}, {"a~", "b"}};
  const struct {
    size_t logged;
    std::set<std::string> disk;
    std::vector<RenamedFile> undo;
  } rows[] = {
      {1, {"a", "b"}, {}},
      {1, {"a~", "b"}, {{"a", "a~"}}},
      {2, {"a~", "b"}, {{"a", "a~"}}},
      {2, {"a~", "a"}, {{"a", "a~"}, {"b", "a"}}},
      {3, {"a~", "a"}, {{"b", "a"}}},
      {3, {"a", "b"}, {{"a", "b"}, {"b", "a"}}},
      {3, {"a"}, {{"a", "b"}, {"b", "a"}}},  // one was deleted
  };
  for (const auto& row : rows) {
    const auto undo =
        RenamesToUndo(std::span(steps).first(row.logged),
                      [&](const std::string& name) { return row.disk.contains(name); });
    EXPECT_EQ(undo, row.undo) << row.logged << " " << row.disk.size();
  }
}

}  // namespace
}  // namespace fotomill::test
