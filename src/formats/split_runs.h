#pragma once

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <span>
#include <vector>

namespace fotomill {

// Splits a row for run-length coding: `putRun(count, value)` receives each run of `shortest` to
// `most` equal bytes, `putPlain(bytes)` the literals in between, which may be empty or longer than
// `most`. Longer runs are split.
template <typename PutPlain, typename PutRun>
void SplitRuns(std::span<const uint8_t> row, size_t shortest, size_t most, PutPlain putPlain,
               PutRun putRun) {
  size_t plain = 0;  // start of the pending literal bytes
  for (size_t x = 0; x < row.size();) {
    const size_t end = std::min(row.size(), x + most);
    size_t next = x + 1;
    while (next < end && row[next] == row[x]) ++next;
    if (next - x >= shortest) {
      putPlain(row.subspan(plain, x - plain));
      putRun(next - x, row[x]);
      plain = next;
    }
    x = next;
  }
  putPlain(row.subspan(plain));
}

// Appends literal tokens, each a count of at most `most` followed by that many bytes.
inline void AppendCounted(std::span<const uint8_t> bytes, size_t most, std::vector<uint8_t>& code) {
  while (!bytes.empty()) {
    const auto part = bytes.first(std::min(bytes.size(), most));
    code.push_back(static_cast<uint8_t>(part.size()));
    code.insert(code.end(), part.begin(), part.end());
    bytes = bytes.subspan(part.size());
  }
}

}  // namespace fotomill
