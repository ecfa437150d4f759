#pragma once

#include "orxregistry/in_file_key.h"
#include "orxutils/orx_string.h"
#include "velta/rtcm_data_support.h"

/// The shared files, which the sibling library owns. What is true of datum files is true of
/// projection files; the differences are in one table.
namespace orx::cs::velta {

inline constexpr const wchar_t* kSiblingLibrary = L"RTCMGridHost.dll";

struct FileKind {
  const wchar_t* extension;
  TDLLFuncWrapper& loader;     ///< of the sibling library
  TCSInFileKey*& current;      ///< the file worked on
  const char* obtainFunction;  ///< entry points of the sibling library
  const char* giveBackFunction;
  ResultCode trouble;  ///< what is answered for a file that cannot be used
};

inline constexpr FileKind kDatumFiles{
    L".dff",          RTCMDataSupport::DLLdatum, RTCMDataSupport::GFFDatumFile,
    "GetPtrDatumGFF", "ResetRTCMDatumFile",      kDatumFileTrouble};
inline constexpr FileKind kProjectionFiles{L".prj",
                                           RTCMDataSupport::DLLprojection,
                                           RTCMDataSupport::GFFProjectionFile,
                                           "GetPtrProjectionGFF",
                                           "ResetRTCMGridFile",
                                           kProjectionFileTrouble};

/// Loads the sibling library unless that has been done.
/// \return 0, kNoSiblingLibrary, or the loader's status
ResultCode LoadSibling(const FileKind& kind);
void UnloadSibling(const FileKind& kind);

/// \param file receives the shared tree, without its lock
/// \return 0, kNoSiblingLibrary, the loader's status, or the sibling library's code
ResultCode Obtain(const FileKind& kind, const COrxStringT<wchar_t>& path, TCSInFileKey** file);
void GiveBack(const FileKind& kind, const COrxStringT<wchar_t>& path);

/// As Obtain, for those who work on the tree: a sibling library that answers 0 and hands out no
/// tree is the kind's trouble.
ResultCode ObtainTree(const FileKind& kind, const COrxStringT<wchar_t>& path, TCSInFileKey** file);

/// Gives a file back when it goes.
class GiveBackLater {
 public:
  /// The path must outlive the object.
  GiveBackLater(const FileKind& kind, const COrxStringT<wchar_t>& path)
      : kind_(kind), path_(path) {}
  GiveBackLater(const GiveBackLater&) = delete;
  GiveBackLater& operator=(const GiveBackLater&) = delete;
  ~GiveBackLater() { GiveBack(kind_, path_); }

 private:
  const FileKind& kind_;
  const COrxStringT<wchar_t>& path_;
};

/// A change of a shared file: either all of it is saved, or it is forgotten when this goes. What
/// was unsaved before is the caller's and is left alone.
class Change {
 public:
  explicit Change(TInFileKey& file) : file_(file), isAlone_(!file.HasUnsavedChanges()) {}
  Change(const Change&) = delete;
  Change& operator=(const Change&) = delete;
  ~Change() {
    if (!isSaved_ && isAlone_) file_.ForgetChanges();
  }

  bool Save() { return isSaved_ = file_.Save(false, kRegistryVersion); }

 private:
  TInFileKey& file_;
  bool isAlone_;
  bool isSaved_ = false;
};

/// Reads a tree again that could not be read when a change of it was forgotten. To be called with
/// the tree's lock, before anything is looked up in it.
void ReadIfLost(TInFileKey& file);

}  // namespace orx::cs::velta
