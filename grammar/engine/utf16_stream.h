#pragma once

#include <zrparsersql/input_stream.h>

namespace zr {

/// The stream of input_stream.h, for the library's own use.
inline pANTLR3_INPUT_STREAM newUtf16InPlaceStream(const char16_t* units, uint32_t length) {
    return zrNewUtf16InPlaceStream(units, length);
}

}  // namespace zr
