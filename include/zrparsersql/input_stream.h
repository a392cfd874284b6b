#ifndef ZRPARSERSQL_INPUT_STREAM_H
#define ZRPARSERSQL_INPUT_STREAM_H

#include <antlr3.h>
#include <stdint.h>
#include <uchar.h>

#ifdef __cplusplus
extern "C" {
#endif

/* An input stream of the parsing runtime over UTF-16 text, read in place: nothing is copied, and every unit
   stands for itself, unpaired surrogates included.

   `units` points to `length` UTF-16 units in the machine's byte order; the text need not be terminated. It
   must stay alive and unchanged until the stream and everything made from it (lexer, tokens, trees) is gone.
   `units` may be null when `length` is 0. Returns null when memory is short. The caller closes the stream
   with `stream->close(stream)`. A stream belongs to one thread. */
pANTLR3_INPUT_STREAM zrNewUtf16InPlaceStream(const char16_t* units, uint32_t length);

#ifdef __cplusplus
}
#endif

#endif
