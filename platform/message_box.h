#pragma once

#include <cstdint>

namespace zr {

// Shows a box by the function that zrSetMessageBoxFunction has set, else as the system does. Answers the
// button that was pressed, 0 where nothing could be shown.
int showMessageBox(void* owner, const char16_t* text, const char16_t* caption, std::uint32_t style);

}  // namespace zr
