#include "printing/page_failure.h"

#include "texts/system_reason.h"
#include "texts/texts.h"

namespace fotomill {

std::string PageFailureHint(Status status, const std::string& path) {
  switch (status) {
    case Status::ErrorCreatingFile: return WithReason(Tr("\"%1\" cannot be created.", path));
    case Status::ErrorWritingFile: return ReasonSentence();
    case Status::ResourceError:
      return Tr(
          "Text needs a font, fontconfig and HarfBuzz: packages fonts-dejavu-core, libfontconfig1 "
          "and libharfbuzz-subset0.");
    default: return {};
  }
}

}  // namespace fotomill
