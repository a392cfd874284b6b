#pragma once

#include <zrparsersql/diagnostics.h>

#include <cstdint>

namespace zr {

// What shows the boxes from now on, null for what the system has; gives what did before.
ZRMessageBoxFunction exchangeMessageBox(ZRMessageBoxFunction function);
ZRMessageBoxFunction currentMessageBox();

// Shows a box by the function that is set, else as the system does. Answers the button that was pressed, 0
// where nothing could be shown.
int showMessageBox(void* owner, const char16_t* text, const char16_t* caption, std::uint32_t style);

}  // namespace zr
