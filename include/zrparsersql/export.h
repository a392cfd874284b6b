#pragma once

/* ZR_API marks what the shared library exports. ZR_SHARED_DECLARATION marks the descriptors and what belongs
   to them: it exports none of it, a host brings the same code along as a static library, and both sides go by
   one declaration. Visible all the same, so that a host made of several modules has one of each. On Windows
   ZR_BUILDING_LIBRARY is defined while the library itself is built. */
#if defined(_WIN32)
#if defined(ZR_BUILDING_LIBRARY)
#define ZR_API __declspec(dllexport)
#else
#define ZR_API __declspec(dllimport)
#endif
#define ZR_SHARED_DECLARATION
#else
#define ZR_API __attribute__((visibility("default")))
#define ZR_SHARED_DECLARATION __attribute__((visibility("default")))
#endif
