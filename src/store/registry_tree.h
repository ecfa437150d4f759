#pragma once

#include "orxregistry/in_file_key.h"
#include "orxregistry/registry_key.h"

/// What is alike in the trees of all datum and projection files.
namespace orx::cs::velta {

/// What new trees are described by.
inline constexpr const wchar_t* kTreeDescription = L"Sylbri RTCM System";

/// The container key of a tree: the first under its root; null when there is none.
TGenericRegistryKey ContainerOf(const TInKey& tree);

/// A change of a shared file: either all of it is saved, or it is forgotten when this goes. What
/// others have left unsaved in the tree is saved first, so that it is not forgotten with it.
class Change {
 public:
  explicit Change(TInFileKey& file)
      : file_(file), isAlone_(!file.HasUnsavedChanges() || file.Save(false, kRegistryVersion)) {}
  Change(const Change&) = delete;
  Change& operator=(const Change&) = delete;
  ~Change() {
    if (isAlone_ && !isSaved_) file_.ForgetChanges();
  }

  /// False when what others have left unsaved cannot be saved; the tree must not be changed then.
  bool IsAlone() const { return isAlone_; }

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
