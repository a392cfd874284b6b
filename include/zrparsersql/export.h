#pragma once

// ZR_API marks what the shared library exports. Everything else is built with hidden visibility. On Windows
// ZR_BUILDING_LIBRARY is defined while the library itself is built.
#if defined(_WIN32)
#if defined(ZR_BUILDING_LIBRARY)
#define ZR_API __declspec(dllexport)
#else
#define ZR_API __declspec(dllimport)
#endif
#else
#define ZR_API __attribute__((visibility("default")))
#endif
