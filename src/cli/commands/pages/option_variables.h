#pragma once

#include <deque>
#include <span>
#include <string>
#include <vector>

#include "cli/frame/command.h"
#include "printing/page_option.h"

namespace fotomill::cli {

// Options of a command that are declared as rows for pages.
class OptionVariables {
 public:
  // Declares options. This object must outlive the parser, and must not be copied then.
  void Add(CLI::App& app, std::span<const PageOption> options);
  // What was given, else the defaults.
  PageValues Values() const;

 private:
  // Where the parser puts the value of an option.
  struct Variable {
    const PageOption* option = nullptr;
    std::string text = {};
    std::vector<std::string> texts = {};
    int32_t number = 0;
    bool flag = false;
  };
  void AddOne(CLI::App& app, const PageOption& option);
  static std::string ValueOf(const Variable& variable);

  std::deque<Variable> variables_;
};

}  // namespace fotomill::cli
