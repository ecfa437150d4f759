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

/// The directory of the file that holds the code at an address; empty when the system cannot tell.
fs::path DirectoryOf(const void* code) {
  std::error_code unknown;
  return dll::symbol_location_ptr(code, unknown).parent_path();
}

/// The library's file beside its asker or among those of this release; empty when it is in neither.
fs::path Find(const fs::path& plainName, const void* asker) {
  const void* const self = reinterpret_cast<const void*>(&DirectoryOf);
  for (const fs::path& directory :
       {DirectoryOf(asker), DirectoryOf(self) / ORXUTILS_MODULE_DIRECTORY}) {
    if (directory.empty()) continue;  // the current directory is nobody's place
    fs::path file = dll::shared_library::decorate(directory / plainName);
    std::error_code unknown;
    if (fs::exists(file, unknown)) return file;
  }
  return {};
}

}  // namespace

TDLLFuncWrapper TDLLFuncLoader::LoadDLL(const COrxStringT<wchar_t>& name) {
  const void* const asker = __builtin_return_address(0);
  auto library = std::make_unique<Library>();
  std::error_code error;
  const fs::path file = Find(PlainName(name), asker);
  if (!file.empty()) {
    library->module.load(file, dll::load_mode::default_mode, error);
    if (error) library->status = kNotLoadable;
  } else {
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
