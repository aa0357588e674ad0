// Visibility of the library's entry points. Everything else in the shared library is hidden; clients reach it
// through the virtual operations of the abstract classes that the entry points hand out.
#pragma once

#if defined(_WIN32)
#if defined(QORVEX_BUILDING)
#define QORVEX_API __declspec(dllexport)
#else
#define QORVEX_API __declspec(dllimport)
#endif
#else
#define QORVEX_API __attribute__((visibility("default")))
#endif

#define QORVEX_VERSION_TEXT "1.14.1.18"
