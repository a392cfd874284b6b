#include "grammar/engine/diagnostics.h"

#include <zrparsersql/diagnostics.h>

#include <atomic>
#include <cstdio>
#include <string>

#include "platform/message_box.h"

namespace {

// The one process-wide setting of the library, as the header tells.
std::atomic<ZRDiagnosticFunction> sinkFunction{nullptr};
std::atomic<void*> sinkUser{nullptr};

void toStandardError(void*, const char16_t* text, std::uint32_t length) {
    std::string line;
    for (std::uint32_t i = 0; i < length; ++i) {
        std::uint32_t c = text[i];
        if (c >= 0xD800 && c < 0xDC00 && i + 1 < length && text[i + 1] >= 0xDC00 && text[i + 1] < 0xE000)
            c = 0x10000 + ((c - 0xD800) << 10) + (text[++i] - 0xDC00u);
        else if (c >= 0xD800 && c < 0xE000)
            c = 0xFFFD;
        if (c < 0x80) {
            line += static_cast<char>(c);
        } else if (c < 0x800) {
            line += static_cast<char>(0xC0 | (c >> 6));
            line += static_cast<char>(0x80 | (c & 0x3F));
        } else if (c < 0x10000) {
            line += static_cast<char>(0xE0 | (c >> 12));
            line += static_cast<char>(0x80 | ((c >> 6) & 0x3F));
            line += static_cast<char>(0x80 | (c & 0x3F));
        } else {
            line += static_cast<char>(0xF0 | (c >> 18));
            line += static_cast<char>(0x80 | ((c >> 12) & 0x3F));
            line += static_cast<char>(0x80 | ((c >> 6) & 0x3F));
            line += static_cast<char>(0x80 | (c & 0x3F));
        }
    }
    line += '\n';
    std::fwrite(line.data(), 1, line.size(), stderr);
}

}  // namespace

void zrSetDiagnostics(uint32_t parts, ZRDiagnostics* diagnostics) {
    const ZRDiagnostics wanted = *diagnostics;
    *diagnostics = {sinkFunction.load(), sinkUser.load(),
                    (parts & ZR_SET_BOX) != 0 ? zr::exchangeMessageBox(wanted.box) : zr::currentMessageBox()};
    if ((parts & ZR_SET_STANDARD_ERROR) != 0) {
        sinkUser.store(nullptr);
        sinkFunction.store(&toStandardError);
    } else if ((parts & ZR_SET_REPORTS) != 0) {
        sinkUser.store(wanted.user);
        sinkFunction.store(wanted.report);
    }
}

namespace zr {

bool diagnosticsWanted() {
    return sinkFunction.load(std::memory_order_relaxed) != nullptr;
}

void diagnose(std::u16string_view report) {
    const ZRDiagnosticFunction function = sinkFunction.load();
    if (function != nullptr)
        function(sinkUser.load(), report.data(), static_cast<std::uint32_t>(report.size()));
}

}  // namespace zr
