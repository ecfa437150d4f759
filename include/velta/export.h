#pragma once

/// VELTA_EXPORT marks what leaves the library. VELTA_STATIC is defined where the library's own
/// objects are linked directly.
#if defined(VELTA_STATIC)
#define VELTA_EXPORT
#elif !defined(_WIN32)
#define VELTA_EXPORT __attribute__((visibility("default")))
#elif defined(VELTA_BUILDING)
#define VELTA_EXPORT __declspec(dllexport)
#else
#define VELTA_EXPORT __declspec(dllimport)
#endif
