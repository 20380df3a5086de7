#include "cli/selection/file_order.h"

#include <algorithm>
#include <numeric>
#include <utility>

#include "core/natural_order.h"
#include "metadata/exif/taken_date.h"
#include "platform/clock.h"
#include "platform/files.h"
#include "platform/process.h"

namespace fotomill::cli {

namespace {

using Key = std::pair<int64_t, int64_t>;

Key NoKey(const std::string&) { return {}; }

Key TimeKey(const std::string& path) {
  const auto time = platform::ModificationTime(path);
  return time ? Key(time->seconds, time->nanoseconds) : Key();
}

// The capture date as a number, from TakenDate.
Key TakenKey(const std::string& path) {
  if (const int64_t taken = TakenDate(path); taken > 0) return {taken, 0};
  const auto [seconds, nanoseconds] = TimeKey(path);
  const platform::LocalTime time = platform::LocalTimeOf(seconds);
  const int64_t day = (time.year * int64_t{100} + time.month) * 100 + time.day;
  return {((day * 100 + time.hour) * 100 + time.minute) * 100 + time.second, nanoseconds};
}

Key SizeKey(const std::string& path) {
  return {static_cast<int64_t>(platform::FactsOf(path).size), 0};
}

struct Order {
  std::string_view name;
  Key (*key)(const std::string& path);
};
constexpr Order kOrders[] = {
    {"name", NoKey}, {"time", TimeKey}, {"taken", TakenKey}, {"size", SizeKey}};

}  // namespace

void SortFiles(const std::string& by, std::vector<BatchFile>& files) {
  const auto* order = std::ranges::find(kOrders, by, &Order::name);
  if (order == std::end(kOrders)) return;
  std::vector<Key> keys;
  for (const BatchFile& file : files) {
    if (platform::PendingExit() != 0) return;
    keys.push_back(order->key(file.name));
  }
  std::vector<size_t> places(files.size());
  std::iota(places.begin(), places.end(), size_t{0});
  std::ranges::stable_sort(places, [&](size_t a, size_t b) {
    if (keys[a] != keys[b]) return keys[a] < keys[b];
    return CompareNatural(files[a].name, files[b].name) < 0;
  });
  std::vector<BatchFile> sorted;
  sorted.reserve(files.size());
  for (const size_t place : places) sorted.push_back(std::move(files[place]));
  files = std::move(sorted);
}

}  // namespace fotomill::cli
