#ifndef ZRPARSERSQL_MESSAGE_BOX_H
#define ZRPARSERSQL_MESSAGE_BOX_H

#include <stdint.h>
#include <uchar.h>
#include <zrparsersql/export.h>

#ifdef __cplusplus
extern "C" {
#endif

/* Shows a message box and answers the button that was pressed. `owner` is the system's window handle or null;
   `text` and `caption` are zero-terminated UTF-16, valid during the call only; `style` is the system's
   combination of buttons and icon, 16 for one button and the error icon. Called on the thread that asks for
   the box, so it may be called on several at once. It must not throw. */
typedef int (*ZRMessageBoxFunction)(void* owner, const char16_t* text, const char16_t* caption,
                                    uint32_t style);

/* Sets what shows the boxes of CZRParseSQLException::DoMessageBox, and gives what did before. Without a
   function (null) it is the system's box on Windows; elsewhere nothing is shown and the answer is 0. One
   setting for the process; may be called from any thread. */
ZR_API ZRMessageBoxFunction zrSetMessageBoxFunction(ZRMessageBoxFunction function);

#ifdef __cplusplus
}
#endif

#endif
