#include "orxutils/dll_func_loader.h"

#include <boost/dll/runtime_symbol_info.hpp>
#include <boost/dll/shared_library.hpp>
#include <filesystem>
#include <system_error>
#include <utility>

#include "orxutils/path.h"

namespace orx {
namespace dll = boost::dll;
namespace fs = std::filesystem;

struct TDLLFuncLoader::Library {
  dll::shared_library module;
  std::int32_t status = 0;
};

namespace {

/// "Name.dll" without its ending, so that the platform's own decoration can be added.
fs::path PlainName(const COrxStringT<wchar_t>& name) {
  fs::path path = ToPath(name).value_or(fs::path());
  return path.extension() == L".dll" ? path.replace_extension() : path;
}

}  // namespace

TDLLFuncWrapper TDLLFuncLoader::LoadDLL(const COrxStringT<wchar_t>& name) {
  const void* const asker = __builtin_return_address(0);
  auto library = std::make_unique<Library>();
  std::error_code error;
  const fs::path directory = dll::symbol_location_ptr(asker, error).parent_path();
  const fs::path beside = dll::shared_library::decorate(directory / PlainName(name));
  if (!error && fs::exists(beside, error)) {
    library->module.load(beside, dll::load_mode::default_mode, error);
    if (error) library->status = kNotLoadable;
  } else {
    error.clear();
    library->module.load(PlainName(name),
                         dll::load_mode::append_decorations | dll::load_mode::search_system_folders,
                         error);
    if (error) return nullptr;
  }
  return TDLLFuncWrapper(new TDLLFuncLoader(std::move(library)));
}

TDLLFuncLoader::TDLLFuncLoader(std::unique_ptr<Library> library) : library_(std::move(library)) {}

TDLLFuncLoader::~TDLLFuncLoader() = default;

std::int32_t TDLLFuncLoader::GetStatus() const { return library_->status; }

void TDLLFuncLoader::ReleaseDLL() { library_->module.unload(); }

void (*TDLLFuncLoader::FindSymbol(const char* name) const)() {
  if (!library_->module.has(name)) return nullptr;
  return &library_->module.get<void()>(name);
}

}  // namespace orx
