#ifndef ZRPARSERSQL_DIAGNOSTICS_H
#define ZRPARSERSQL_DIAGNOSTICS_H

#include <stdint.h>
#include <uchar.h>
#include <zrparsersql/export.h>

#ifdef __cplusplus
extern "C" {
#endif

/* Where reports about the text go: characters that start no token, places where a query couldn't be read, the
   trace of the text preparation. Silent until a host asks for them; error counts are kept either way.

   `text` is one report of `length` UTF-16 units without a line end; it is valid during the call only. The
   function is called on the thread that analyses; a host that analyses on several threads gives a function
   that may be called from all of them at once. It must not throw. */
typedef void (*ZRDiagnosticFunction)(void* user, const char16_t* text, uint32_t length);

/* Sends reports to `function` with `user`, or nowhere when `function` is null. One setting for the process.
   Set it while no analysis is at work. */
ZR_API void zrSetDiagnosticFunction(ZRDiagnosticFunction function, void* user);

/* Sends reports to standard error as UTF-8 lines (`on` not 0), or nowhere (0). Replaces a function set
 * before. */
ZR_API void zrDiagnosticsToStandardError(int on);

#ifdef __cplusplus
}
#endif

#endif
