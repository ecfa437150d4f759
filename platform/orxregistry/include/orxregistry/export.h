#pragma once

#if !defined(_WIN32)
#define ORXREGISTRY_EXPORT __attribute__((visibility("default")))
#elif defined(ORXREGISTRY_BUILDING)
#define ORXREGISTRY_EXPORT __declspec(dllexport)
#else
#define ORXREGISTRY_EXPORT __declspec(dllimport)
#endif
