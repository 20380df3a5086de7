#include "files/rename_log.h"

#include <algorithm>

#include "core/whole_number.h"

namespace fotomill {

namespace {

constexpr const char* kLogName = "FMWRenameUndo.dat";

UndoRecord NumberRecord(uint32_t number) { return {{}, std::to_string(number)}; }

}  // namespace

RenameLog::RenameLog(std::optional<uint32_t> number)
    : log_(kLogName, number ? std::optional(NumberRecord(*number)) : std::nullopt) {}

std::optional<RenameHistory> ReadRenameLog() {
  const auto records = ReadUndoLog(kLogName);
  if (!records) return std::nullopt;
  RenameHistory history;
  for (const UndoRecord& record : *records) {
    if (!record.first.empty()) {
      history.files.push_back({record.first, record.second});
    } else if (const auto number = ParseNumber<uint32_t>(record.second)) {
      history.number = std::min(*number, history.number.value_or(UINT32_MAX));
    }
  }
  return history;
}

bool WriteRenameLog(const RenameHistory& history) {
  std::vector<UndoRecord> records;
  if (history.number && !history.files.empty()) records.push_back(NumberRecord(*history.number));
  for (const RenamedFile& file : history.files) records.push_back({file.from, file.to});
  return WriteUndoLog(kLogName, records);
}

}  // namespace fotomill
