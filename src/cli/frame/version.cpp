#include "cli/frame/version.h"

#include "cli/frame/libraries.h"
#include "cli/frame/result_output.h"
#include "plugins/plugin_table.h"
#include "texts/texts.h"

namespace fotomill::cli {

namespace {

// How a library is linked, for JSON.
constexpr const char* kLinkings[] = {"inside", "shared", "loaded"};

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
                                   {"linking", kLinkings[static_cast<size_t>(library.linking)]},
                                   {"present", library.present}});
  }
  return object.dump(2, ' ', false, Json::error_handler_t::replace) + "\n";
}

}  // namespace

std::string VersionPage(const VersionOptions& options) {
  EnablePlugins();  // they use libraries, too
  if (options.json) return JsonPage();
  std::string page = std::string(kProgramName) + " " + kProgramVersion + "\n";
  if (options.licenses) return page + Tr(kLicenseNote) + "\n" + LicensesText(Libraries());
  for (const Library& library : Libraries())
    page += library.name + " " + VersionText(library) + "\n";
  return page;
}

}  // namespace fotomill::cli
