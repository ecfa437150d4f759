#pragma once

/// VELTA_RTCM3_EXPORT marks what leaves the codec library.
#if !defined(_WIN32)
#define VELTA_RTCM3_EXPORT __attribute__((visibility("default")))
#elif defined(VELTA_RTCM3_BUILDING)
#define VELTA_RTCM3_EXPORT __declspec(dllexport)
#else
#define VELTA_RTCM3_EXPORT __declspec(dllimport)
#endif
