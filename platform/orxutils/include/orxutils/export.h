#pragma once

#if !defined(_WIN32)
#define ORXUTILS_EXPORT __attribute__((visibility("default")))
#elif defined(ORXUTILS_BUILDING)
#define ORXUTILS_EXPORT __declspec(dllexport)
#else
#define ORXUTILS_EXPORT __declspec(dllimport)
#endif
