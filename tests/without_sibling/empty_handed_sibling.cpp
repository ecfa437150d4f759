// A sibling library that answers 0 and hands out no tree.

#ifdef _WIN32
#define EXPORTED extern "C" __declspec(dllexport)
#else
#define EXPORTED extern "C" __attribute__((visibility("default")))
#endif

EXPORTED int GetPtrDatumGFF(const wchar_t*, void**) { return 0; }
EXPORTED int GetPtrProjectionGFF(const wchar_t*, void**) { return 0; }
