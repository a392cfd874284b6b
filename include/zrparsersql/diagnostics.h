#ifndef ZRPARSERSQL_DIAGNOSTICS_H
#define ZRPARSERSQL_DIAGNOSTICS_H

#include <stddef.h>
#include <stdint.h>
#include <uchar.h>
#include <zrparsersql/export.h>

#ifdef __cplusplus
extern "C" {
#endif

/* What the library has to tell a person goes where its host says, for the whole process: reports about the
   text, and the message box of an exception. Nothing is shown until a host asks for it, but for the box on
   Windows, which is then the system's. */

/* Gets the reports: characters that start no token, places where a query couldn't be read, the trace of the
   text preparation. Error counts are kept with or without it.

   `text` is one report of `length` UTF-16 units without a line end; it is valid during the call only. `user`
   is what was set along with the function. The function is called on the thread that analyses; a host that
   analyses on several threads gives a function that may be called from all of them at once. It must not
   throw. */
typedef void (*ZRDiagnosticFunction)(void* user, const char16_t* text, uint32_t length);

/* Shows the box of CZRParseSQLException::DoMessageBox and answers the button that was pressed. `owner` is the
   system's window handle or null; `text` and `caption` are zero-terminated UTF-16, valid during the call
   only; `style` is the system's combination of buttons and icon, 16 for one button and the error icon. Called
   on the thread that asks for the box, so it may be called on several at once. It must not throw. */
typedef int (*ZRMessageBoxFunction)(void* owner, const char16_t* text, const char16_t* caption,
                                    uint32_t style);

/* The setting. The library keeps the pointers and owns nothing of what they point to. */
typedef struct ZRDiagnostics {
    ZRDiagnosticFunction report; /* null: reports go nowhere */
    void* user;                  /* for `report` */
    ZRMessageBoxFunction box;    /* null: the system's box on Windows, elsewhere none and the answer 0 */
} ZRDiagnostics;

/* Parts of the setting, for zrSetDiagnostics; any sum of them. */
enum {
    ZR_SET_REPORTS = 1,        /* `report` and `user` */
    ZR_SET_BOX = 2,            /* `box` */
    ZR_SET_STANDARD_ERROR = 4, /* reports go to standard error as UTF-8 lines, whatever `report` is */
};

/* Sets those parts to what stands in `diagnostics`, which can't be null, and stores in it all that was set
   before: handing that back restores it, and no part at all just asks. Can't fail.

   Any thread may set the box at any time. Reports are for a time when no analysis is at work: function and
   `user` are not changed in one step. */
ZR_API void zrSetDiagnostics(uint32_t parts, ZRDiagnostics* diagnostics);

/* The functions below are part of the host: only zrSetDiagnostics is the library's. They are C as well, which
   has no nullptr. */
/* NOLINTBEGIN(modernize-use-nullptr) */
#ifdef __cplusplus
#define ZR_IN_HEADER inline
#else
#define ZR_IN_HEADER static inline
#endif

/* Sends reports to `function` with `user`, or nowhere when `function` is null. */
ZR_IN_HEADER void zrSetDiagnosticFunction(ZRDiagnosticFunction function, void* user) {
    ZRDiagnostics diagnostics = {function, user, NULL};
    zrSetDiagnostics(ZR_SET_REPORTS, &diagnostics);
}

/* Sends reports to standard error (`on` not 0), or nowhere (0). Replaces a function set before. */
ZR_IN_HEADER void zrDiagnosticsToStandardError(int on) {
    ZRDiagnostics diagnostics = {NULL, NULL, NULL};
    zrSetDiagnostics(on ? ZR_SET_STANDARD_ERROR : ZR_SET_REPORTS, &diagnostics);
}

/* Sets what shows message boxes, null for what the system has, and gives what did before. */
ZR_IN_HEADER ZRMessageBoxFunction zrSetMessageBoxFunction(ZRMessageBoxFunction function) {
    ZRDiagnostics diagnostics = {NULL, NULL, function};
    zrSetDiagnostics(ZR_SET_BOX, &diagnostics);
    return diagnostics.box;
}

/* NOLINTEND(modernize-use-nullptr) */
#undef ZR_IN_HEADER

#ifdef __cplusplus
}
#endif

#endif
