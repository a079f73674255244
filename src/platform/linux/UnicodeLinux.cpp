#include <hb.h>

#include "platform/Unicode.h"

namespace Glimmer::Platform {

// HarfBuzz's script values are the ISO 15924 tags themselves.
uint32_t ScriptOf(uint32_t codePoint) {
    return uint32_t(hb_unicode_script(hb_unicode_funcs_get_default(), codePoint));
}

}  // namespace Glimmer::Platform
