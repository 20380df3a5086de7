#pragma once

#include "settings/settings.h"

namespace fotomill::test {

// Restores every setting when the test ends.
class ScopedSettings {
 public:
  ScopedSettings() : saved_(settings) {}
  ~ScopedSettings() { settings = saved_; }

 private:
  Settings saved_;
};

}  // namespace fotomill::test
