#include "platform/guid.h"

#include <uuid/uuid.h>

namespace zr {

int createGuidText(CString& text) {
    static constexpr char16_t kDigits[] = u"0123456789ABCDEF";
    uuid_t guid;
    // The service has no way to fail: it falls back to weaker sources of chance by itself.
    uuid_generate_random(guid);
    char16_t units[38];
    char16_t* out = units;
    *out++ = u'{';
    for (int byte = 0; byte < 16; ++byte) {
        if (byte == 4 || byte == 6 || byte == 8 || byte == 10) *out++ = u'-';
        *out++ = kDigits[guid[byte] >> 4];
        *out++ = kDigits[guid[byte] & 15];
    }
    *out++ = u'}';
    text = std::u16string_view(units, static_cast<std::size_t>(out - units));
    return 0;
}

}  // namespace zr
