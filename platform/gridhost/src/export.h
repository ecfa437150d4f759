#pragma once

#if !defined(_WIN32)
#define GRIDHOST_EXPORT extern "C" __attribute__((visibility("default")))
#else
#define GRIDHOST_EXPORT extern "C" __declspec(dllexport)
#endif
