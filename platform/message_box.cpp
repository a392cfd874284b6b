#include "platform/message_box.h"

#include <atomic>

#if defined(_WIN32)
#include <windows.h>
#endif

namespace {

// The one thing a host sets for the whole process: there is one user interface.
std::atomic<ZRMessageBoxFunction> currentFunction{nullptr};

}  // namespace

ZRMessageBoxFunction zr::exchangeMessageBox(ZRMessageBoxFunction function) {
    return currentFunction.exchange(function);
}

ZRMessageBoxFunction zr::currentMessageBox() {
    return currentFunction.load();
}

int zr::showMessageBox(void* owner, const char16_t* text, const char16_t* caption, std::uint32_t style) {
    if (const ZRMessageBoxFunction function = currentFunction.load())
        return function(owner, text, caption, style);
#if defined(_WIN32)
    return ::MessageBoxW(static_cast<HWND>(owner), reinterpret_cast<const wchar_t*>(text),
                         reinterpret_cast<const wchar_t*>(caption), style);
#else
    return 0;
#endif
}
