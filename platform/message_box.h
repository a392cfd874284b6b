#pragma once

#include "zrparsersql/export.h"

namespace zr {

// Shows a message box. Text and caption are zero-terminated UTF-16; owner is the system's window handle or
// null; style is the system's combination of buttons and icon. Answers the button that was pressed.
using MessageBoxHandler = int (*)(void* owner, const char16_t* text, const char16_t* caption, unsigned style);

// On Windows the system's box. Elsewhere, and wherever a handler is set, the handler; without one nothing is
// shown and the answer is 0.
int showMessageBox(void* owner, const char16_t* text, const char16_t* caption, unsigned style);

// Sets the handler of the process and gives the one before; null takes it away. May be called from any
// thread.
ZR_API MessageBoxHandler setMessageBoxHandler(MessageBoxHandler handler);

}  // namespace zr
