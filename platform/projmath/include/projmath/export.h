#pragma once

#if !defined(_WIN32)
#define PROJMATH_EXPORT __attribute__((visibility("default")))
#elif defined(PROJMATH_BUILDING)
#define PROJMATH_EXPORT __declspec(dllexport)
#else
#define PROJMATH_EXPORT __declspec(dllimport)
#endif
