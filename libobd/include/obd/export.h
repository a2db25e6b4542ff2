#pragma once

/// Marks what the library shows to applications; all else stays hidden inside it.
#if defined(OBD_STATIC)
#define OBD_EXPORT
#elif defined(_WIN32)
#if defined(OBD_BUILD)
#define OBD_EXPORT __declspec(dllexport)
#else
#define OBD_EXPORT __declspec(dllimport)
#endif
#else
#define OBD_EXPORT __attribute__((visibility("default")))
#endif
