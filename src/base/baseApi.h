#pragma once

// Export macros and compiler attributes. Everything that is not marked stays inside its library.

#if defined(_WIN32)
#define ORV_DLL_EXPORT __declspec(dllexport)
#define ORV_DLL_IMPORT __declspec(dllimport)
#define ORV_VISIBLE
#define ORV_PRINTF_STYLE gnu_printf
#else
#define ORV_DLL_EXPORT __attribute__((visibility("default")))
#define ORV_DLL_IMPORT __attribute__((visibility("default")))
#define ORV_VISIBLE __attribute__((visibility("default")))
#define ORV_PRINTF_STYLE printf
#endif

#if defined(ORV_BASE_BUILDING)
#define ORV_BASE_API ORV_DLL_EXPORT
#else
#define ORV_BASE_API ORV_DLL_IMPORT
#endif

// Header-only classes that are thrown or cast to across libraries.
#define ORV_HEADER_API ORV_VISIBLE

// Lets the compiler check arguments against a printf format; counts `this` as the first.
#define ORV_PRINTF_FORMAT(formatIndex, firstArgument) \
    __attribute__((format(ORV_PRINTF_STYLE, formatIndex, firstArgument)))
