#pragma once

#if !defined(_WIN32)
#define USERDIRS_EXPORT __attribute__((visibility("default")))
#elif defined(USERDIRS_BUILDING)
#define USERDIRS_EXPORT __declspec(dllexport)
#else
#define USERDIRS_EXPORT __declspec(dllimport)
#endif
