#include "cli/frame/version.h"

#include "cli/frame/libraries.h"
#include "cli/frame/result_output.h"
#include "plugins/plugin_table.h"
#include "texts/texts.h"

namespace fotomill::cli {

namespace {

// How a library is linked: word for JSON, text in English.
struct LinkingRow {
  const char* word;
  const char* text;
};
constexpr LinkingRow kLinkings[] = {
    {"inside", TrLater("part of the program")},
    {"shared", TrLater("a library of the system")},
    {"loaded", TrLater("a library of the system")},
};
const LinkingRow& RowOf(Linking linking) { return kLinkings[static_cast<size_t>(linking)]; }

std::string JsonPage() {
  Json object{{"name", kProgramName},
              {"version", kProgramVersion},
              {"buildDate", kBuildDate},
              {"license", kLicenseNote},
              {"libraries", Json::array()}};
  for (const Library& library : Libraries()) {
    object["libraries"].push_back({{"name", library.name},
                                   {"version", library.version},
                                   {"license", library.license},
                                   {"copyright", library.copyright},
                                   {"purpose", library.purpose},
                                   {"linking", RowOf(library.linking).word},
                                   {"present", library.present}});
  }
  return object.dump(2, ' ', false, Json::error_handler_t::replace) + "\n";
}

std::string LicensesPage() {
  std::string page;
  for (const Library& library : Libraries()) {
    page += "\n" + library.name + " " + VersionText(library) + ": " + library.license + "\n";
    page += "  Copyright " + std::string(library.copyright) + "\n";
    page += "  " + std::string(Tr(library.purpose)) + "; " + Tr(RowOf(library.linking).text) + "\n";
  }
  return page;
}

}  // namespace

std::string VersionPage(const VersionOptions& options) {
  EnablePlugins();  // they use libraries, too
  if (options.json) return JsonPage();
  std::string page = std::string(kProgramName) + " " + kProgramVersion + "\n";
  if (options.licenses) return page + Tr(kLicenseNote) + "\n" + LicensesPage();
  for (const Library& library : Libraries())
    page += library.name + " " + VersionText(library) + "\n";
  return page;
}

}  // namespace fotomill::cli
