#pragma once

#include "orxregistry/in_file_key.h"
#include "orxutils/orx_string.h"
#include "store/area_search.h"
#include "velta/file_names.h"
#include "velta/rtcm_data_support.h"

/// The shared files, which the sibling library owns. What is true of datum files is true of
/// projection files; the differences are in one table.
namespace orx::cs::velta {

inline constexpr const wchar_t* kSiblingLibrary = L"RTCMGridHost.dll";

struct SharedFiles {
  const wchar_t* extension;
  TDLLFuncWrapper& loader;     ///< of the sibling library
  TCSInFileKey*& current;      ///< the file worked on
  const char* obtainFunction;  ///< entry points of the sibling library
  const char* giveBackFunction;
  const EntryAreas& (*areas)();  ///< by which new files find their entries
  ResultCode trouble;            ///< what is answered for a file that cannot be used
};

inline constexpr SharedFiles kDatumFiles{
    kDatumFileExtension, RTCMDataSupport::DLLdatum, RTCMDataSupport::GFFDatumFile,
    "GetPtrDatumGFF",    "ResetRTCMDatumFile",      &DatumAreas,
    kDatumFileTrouble};
inline constexpr SharedFiles kProjectionFiles{kProjectionFileExtension,
                                              RTCMDataSupport::DLLprojection,
                                              RTCMDataSupport::GFFProjectionFile,
                                              "GetPtrProjectionGFF",
                                              "ResetRTCMGridFile",
                                              &ProjectionAreas,
                                              kProjectionFileTrouble};

/// Loads the sibling library unless that has been done.
/// \return 0, kNoSiblingLibrary, or the loader's status
ResultCode LoadSibling(const SharedFiles& kind);
void UnloadSibling(const SharedFiles& kind);

/// \param file receives the shared tree, without its lock
/// \return 0, kNoSiblingLibrary, the loader's status, or the sibling library's code
ResultCode Obtain(const SharedFiles& kind, const COrxStringT<wchar_t>& path, TCSInFileKey** file);
void GiveBack(const SharedFiles& kind, const COrxStringT<wchar_t>& path);

/// As Obtain, for those who work on the tree: a sibling library that answers 0 and hands out no
/// tree is the kind's trouble.
ResultCode ObtainTree(const SharedFiles& kind, const COrxStringT<wchar_t>& path,
                      TCSInFileKey** file);

/// Gives a file back when it goes.
class GiveBackLater {
 public:
  /// The path must outlive the object.
  GiveBackLater(const SharedFiles& kind, const COrxStringT<wchar_t>& path)
      : kind_(kind), path_(path) {}
  GiveBackLater(const GiveBackLater&) = delete;
  GiveBackLater& operator=(const GiveBackLater&) = delete;
  ~GiveBackLater() { GiveBack(kind_, path_); }

 private:
  const SharedFiles& kind_;
  const COrxStringT<wchar_t>& path_;
};

}  // namespace orx::cs::velta
