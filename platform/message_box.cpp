#include "platform/message_box.h"

#include <atomic>

#if defined(_WIN32)
#include <windows.h>
#endif

namespace zr {
namespace {

// The one thing a host sets for the whole process: there is one user interface.
std::atomic<MessageBoxHandler> currentHandler{nullptr};

}  // namespace

MessageBoxHandler setMessageBoxHandler(MessageBoxHandler handler) {
    return currentHandler.exchange(handler);
}

int showMessageBox(void* owner, const char16_t* text, const char16_t* caption, unsigned style) {
    if (const MessageBoxHandler handler = currentHandler.load()) return handler(owner, text, caption, style);
#if defined(_WIN32)
    return ::MessageBoxW(static_cast<HWND>(owner), reinterpret_cast<const wchar_t*>(text),
                         reinterpret_cast<const wchar_t*>(caption), style);
#else
    return 0;
#endif
}

}  // namespace zr
