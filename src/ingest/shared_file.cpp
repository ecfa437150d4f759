#include "ingest/shared_file.h"

namespace orx::cs::velta {
namespace {

using ObtainFunction = ResultCode(const wchar_t* path, TCSInFileKey** file);
using GiveBackFunction = void(const wchar_t* path);

}  // namespace

ResultCode LoadSibling(const SharedFiles& kind) {
  if (!kind.loader) kind.loader = TDLLFuncLoader::LoadDLL(kSiblingLibrary);
  return kind.loader ? kind.loader->GetStatus() : kNoSiblingLibrary;
}

void UnloadSibling(const SharedFiles& kind) {
  if (!kind.loader) return;
  kind.loader->ReleaseDLL();
  kind.loader.reset();
}

ResultCode Obtain(const SharedFiles& kind, const COrxStringT<wchar_t>& path, TCSInFileKey** file) {
  if (!kind.loader) {
    const ResultCode status = LoadSibling(kind);
    if (status != kSuccess) {
      UnloadSibling(kind);
      return status;
    }
  }
  auto* const obtain = kind.loader->GetFunc<ObtainFunction>(kind.obtainFunction);
  return obtain ? obtain(path.c_str(), file) : kNoSiblingLibrary;
}

ResultCode ObtainTree(const SharedFiles& kind, const COrxStringT<wchar_t>& path,
                      TCSInFileKey** file) {
  const ResultCode result = Obtain(kind, path, file);
  return result == kSuccess && !*file ? kind.trouble : result;
}

void GiveBack(const SharedFiles& kind, const COrxStringT<wchar_t>& path) {
  if (!kind.loader) return;
  auto* const giveBack = kind.loader->GetFunc<GiveBackFunction>(kind.giveBackFunction);
  if (giveBack) giveBack(path.c_str());
}

}  // namespace orx::cs::velta
