#pragma once

#include <cstdint>
#include <span>
#include <string>
#include <vector>

#include "plugins/fotomill_plugin.h"

namespace fotomill {

// The configuration table as bytes, for a worker process, which has not loaded the user's settings.
std::vector<uint8_t> CarriedConfiguration(std::span<const FMW_CONFIG_ENTRY> rows);

// The table in the worker process, with names and values of its own.
class ConfigurationCopy {
 public:
  // Unpacks the bytes; keeps what it has if they are the same as before.
  void Take(std::span<const uint8_t> carried);
  std::span<const FMW_CONFIG_ENTRY> Rows() const { return rows_; }

 private:
  std::vector<uint8_t> carried_;
  std::vector<int32_t> numbers_;
  std::vector<FMW_CONFIG_ENTRY> rows_;  // texts point into `carried_`
};

}  // namespace fotomill
