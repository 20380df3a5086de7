#pragma once

#include <map>
#include <string>

#include "plugins/module_facts.h"

namespace fotomill {

// What modules have said about themselves, so that they need not be loaded to be asked again. Kept
// in a text file in the data folder, if that folder exists; a module whose file has changed is not
// found.
class FactsCache {
 public:
  FactsCache();  // reads the file
  // False if the module is not in it.
  bool Find(const std::string& path, ModuleFacts& facts) const;
  void Put(const std::string& path, const ModuleFacts& facts);
  // Writes the file if anything was put. It is no loss if that fails.
  void Save();

 private:
  std::map<std::string, std::string> texts_;  // by line of BadModuleLine
  bool changed_ = false;
};

}  // namespace fotomill
