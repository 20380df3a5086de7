#include "platform/utf8_locale.h"

#include <locale.h>

namespace fotomill::platform {

Utf8Locale::Utf8Locale() {
  const locale_t made = newlocale(LC_CTYPE_MASK, "C.UTF-8", nullptr);
  if (made == nullptr) return;
  locale_ = made;
  previous_ = uselocale(made);
}

Utf8Locale::~Utf8Locale() {
  if (locale_ == nullptr) return;
  uselocale(static_cast<locale_t>(previous_));
  freelocale(static_cast<locale_t>(locale_));
}

}  // namespace fotomill::platform
