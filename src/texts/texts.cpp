#include "texts/texts.h"

#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <span>
#include <utility>

#include "core/text.h"
#include "platform/files.h"
#include "platform/folders.h"
#include "platform/paths.h"
#include "platform/process.h"
#include "texts/grouped_count.h"
#include "texts/message_catalog.h"

namespace fotomill {

namespace {

constexpr const char* kDomain = "fotomill";
constexpr const char* kEnglish = "en";

struct {
  std::string language = kEnglish;
  bool translated = false;
  MessageCatalog catalog;
} state;

constexpr struct {
  const char* code;
  const char* name;
} kNames[] = {{"de", "Deutsch"},    {"en", "English"},  {"es", "Español"},
              {"fr", "Français"},   {"it", "Italiano"}, {"ja", "日本語"},
              {"nl", "Nederlands"}, {"pl", "Polski"},   {"pt", "Português"}};

// Catalogs are in the folder "locale" next to the program in a build tree, and in
// share/locale once installed.
std::string CatalogFolder() {
  const std::string program = platform::ProgramFolder();
  const std::string beside = platform::JoinFolder(program, "locale");
  if (platform::IsFolder(beside)) return beside;
  return platform::JoinFolder(platform::FolderOf(program), "share/locale");
}

std::string CatalogPath(const std::string& folder, const std::string& code) {
  return platform::JoinFolder(folder, code + "/LC_MESSAGES/" + kDomain + ".mo");
}

bool HasCatalog(const std::string& folder, const std::string& code) {
  const bool plain = !code.empty() && std::ranges::all_of(code, [](char c) {
    return IsLetter(c) || c == '_' || c == '@';
  });
  return plain && platform::FileExists(CatalogPath(folder, code));
}

std::string Variable(const char* name) {
  const char* value = std::getenv(name);
  return value == nullptr ? std::string() : value;
}

// The languages of the environment in order of preference, separated by colons. As in gettext,
// LANGUAGE counts only if a locale is set.
std::string LanguagesOfSystem() {
  std::string locale = Variable("LC_ALL");
  if (locale.empty()) locale = Variable("LC_MESSAGES");
  if (locale.empty()) locale = Variable("LANG");
  if (locale.empty() || locale == "C" || locale == "POSIX") return {};
  const std::string languages = Variable("LANGUAGE");
  return languages.empty() ? locale : languages;
}

// The first language of `wanted` with a catalog, with or without its country; else English.
std::string ChooseLanguage(std::string_view wanted, const std::string& folder) {
  while (!wanted.empty()) {
    const std::string_view item = wanted.substr(0, wanted.find(':'));
    wanted.remove_prefix(std::min(item.size() + 1, wanted.size()));
    const std::string code(item.substr(0, item.find('.')));
    const std::string country = code.substr(0, code.find('@')),
                      language = code.substr(0, code.find_first_of("_@"));
    for (const std::string& form : {code, country, language}) {
      if (HasCatalog(folder, form)) return form;
    }
    if (language == kEnglish) break;
  }
  return kEnglish;
}

// `text` with %1, %2, ... replaced. Numbers without an argument are kept.
std::string Filled(std::string_view text, std::span<const TextArgument> arguments) {
  std::string result;
  for (size_t i = 0; i < text.size(); ++i) {
    const bool last = text[i] != '%' || i + 1 == text.size();
    const size_t number = last ? arguments.size() : static_cast<size_t>(text[i + 1] - '1');
    if (number < arguments.size()) {
      result += arguments[number].Text();
      ++i;
    } else {
      result += text[i];
    }
  }
  return result;
}

// The plural form for a count, with %1 replaced by `digits`.
std::string FilledCount(const char* one, const char* many, uint64_t count, std::string digits,
                        std::initializer_list<TextArgument> arguments) {
  const char* text = state.translated ? state.catalog.FindPlural(one, count) : nullptr;
  if (text == nullptr) text = count == 1 ? one : many;
  std::vector<TextArgument> all{std::move(digits)};
  all.insert(all.end(), arguments);
  return Filled(text, all);
}

}  // namespace

bool StartTexts(const std::string& code) {
  const std::string folder = CatalogFolder();
  state.language = ChooseLanguage(code.empty() ? LanguagesOfSystem() : code, folder);
  state.translated =
      state.language != kEnglish && state.catalog.Load(CatalogPath(folder, state.language));
  if (!state.translated) state.language = kEnglish;
  // toolkits read it, too
  if (state.translated || !code.empty()) platform::SetVariable("LANGUAGE", state.language);
  return state.translated || code.empty() || code.starts_with(kEnglish);
}

const std::string& TextLanguage() { return state.language; }

std::vector<Language> Languages() {
  std::vector<Language> languages{{kEnglish, "English"}};
  const std::string folder = CatalogFolder();
  const auto entries = platform::ListFolder(folder);
  if (!entries) return languages;
  for (const auto& entry : *entries) {
    if (entry.name == kEnglish || !HasCatalog(folder, entry.name)) continue;
    const auto row =
        std::ranges::find_if(kNames, [&](const auto& name) { return entry.name == name.code; });
    languages.push_back({entry.name, row == std::end(kNames) ? entry.name : row->name});
  }
  std::ranges::sort(languages.begin() + 1, languages.end(), {}, &Language::name);
  return languages;
}

const char* Tr(const char* text) {
  const char* const translation =
      state.translated && *text != '\0' ? state.catalog.Find(text) : nullptr;
  return translation != nullptr ? translation : text;
}

std::string ThousandsText(uint64_t number) {
  // Translators: a thousand, with the separator of the language.
  const std::string_view sample = Tr("1,000");
  std::string text = WithThousands(number);
  if (sample.size() > 4) {
    const std::string separator(sample.substr(1, sample.size() - 4));
    for (size_t at = text.find(','); at != std::string::npos;
         at = text.find(',', at + separator.size())) {
      text.replace(at, 1, separator);
    }
  }
  return text;
}

std::string DecimalText(double number, int digits) {
  char text[64];
  std::snprintf(text, sizeof text, "%.*f", digits, number);
  // Translators: one half, with the decimal separator of the language.
  const std::string_view sample = Tr("0.5");
  std::string result = text;
  if (const size_t point = result.find('.'); point != std::string::npos && sample.size() > 2) {
    result.replace(point, 1, sample.substr(1, sample.size() - 2));
  }
  return result;
}

std::string Tr(std::string_view text) { return Tr(std::string(text).c_str()); }

std::string TrArguments(const char* text, std::initializer_list<TextArgument> arguments) {
  return Filled(Tr(text), std::span(arguments.begin(), arguments.size()));
}

RecordedText TrRecordedArguments(const char* text, std::initializer_list<TextArgument> arguments) {
  const std::span given(arguments.begin(), arguments.size());
  return {Filled(text, given), Filled(Tr(text), given)};
}

void RecordedText::Append(const RecordedText& more) {
  if (more.empty()) return;
  (english += empty() ? "" : " ") += more.english;
  (shown += shown.empty() ? "" : " ") += more.shown;
}

std::string TrCountArguments(const char* one, const char* many, uint64_t count,
                             std::initializer_list<TextArgument> arguments) {
  return FilledCount(one, many, count, std::to_string(count), arguments);
}

std::string TrGroupedCountArguments(const char* one, const char* many, uint64_t count,
                                    std::initializer_list<TextArgument> arguments) {
  return FilledCount(one, many, count, ThousandsText(count), arguments);
}

}  // namespace fotomill
