#pragma once

#include <cstdint>
#include <memory>

#include "orxutils/export.h"
#include "orxutils/orx_string.h"

namespace orx {

class TDLLFuncLoader;

/// Owner of a loader; empty when nothing has been loaded.
using TDLLFuncWrapper = std::unique_ptr<TDLLFuncLoader>;

/// A library loaded at run time.
class ORXUTILS_EXPORT TDLLFuncLoader {
 public:
  /// The status of a library that was found and that the system refused to load.
  static constexpr std::int32_t kNotLoadable = static_cast<std::int32_t>(0x8007000B);

  /// Loads a library by the name that Windows uses ("Name.dll"), which becomes the platform's own
  /// ("libName.so"). Looks beside the library that calls this, then where those lie that only this
  /// release loads, then where the system looks.
  /// \return the loader, or null when there is no such library
  static TDLLFuncWrapper LoadDLL(const COrxStringT<wchar_t>& name);

  ~TDLLFuncLoader();

  /// 0 when the library is usable, kNotLoadable otherwise.
  std::int32_t GetStatus() const;

  /// Unloads the library; functions obtained from it must not be called any more.
  void ReleaseDLL();

  /// \return the exported function of that name, or null
  template <class Function>
  Function* GetFunc(const char* name) const {
    return reinterpret_cast<Function*>(FindSymbol(name));
  }

 private:
  struct Library;

  explicit TDLLFuncLoader(std::unique_ptr<Library> library);
  void (*FindSymbol(const char* name) const)();

  std::unique_ptr<Library> library_;
};

}  // namespace orx
