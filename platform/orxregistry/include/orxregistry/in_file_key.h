#pragma once

#include <boost/thread/recursive_mutex.hpp>
#include <chrono>
#include <cstdint>
#include <filesystem>
#include <functional>
#include <memory>

#include "orxregistry/entry_areas.h"
#include "orxregistry/export.h"
#include "orxregistry/registry_key.h"
#include "orxutils/orx_string.h"

namespace orx {

class KeyTree;

/// Error states of a tree.
enum RegistryError : std::uint32_t {
  kRegistryOk = 0,
  kCannotBeOpened = 1,
  kNotARegistryFile = 2,
  kDamaged = 3
};

/// The only registry version there is.
inline constexpr unsigned kRegistryVersion = 512;

/// What trees are made and opened with; no meaning here.
inline constexpr unsigned kRegistryFlags = 97;

/// How long a save waits for a file that another process holds.
inline constexpr std::chrono::seconds kLongestLockWait{10};

/// Hears of a file whose lock another process holds, in the thread that saves.
using AwaitedLock = std::function<void(const COrxStringT<wchar_t>& file)>;

/// Has it told when a save waits for a file's lock for more than a second.
/// \param tell may be empty; to be set before the first save
ORXREGISTRY_EXPORT void OnAwaitedLock(AwaitedLock tell);

/// A registry tree.
class ORXREGISTRY_EXPORT TInKey {
 public:
  TInKey(const TInKey&) = delete;
  TInKey& operator=(const TInKey&) = delete;
  virtual ~TInKey();

  /// A RegistryError: kRegistryOk when the tree was made or loaded without error. A damaged tree
  /// presents its keys up to the damage.
  std::uint32_t GetErrorState() const;

 protected:
  /// \param tree not null
  explicit TInKey(std::shared_ptr<KeyTree> tree);

  std::shared_ptr<KeyTree> tree_;  ///< the tree, which keys of it keep alive, too

 private:
  friend class TGenericRegistryKeyPtr;
};

/// A registry tree that is kept in a file.
class ORXREGISTRY_EXPORT TInFileKey : public TInKey {
 public:
  /// Makes a new tree or loads a file; GetErrorState() tells how that went.
  /// \param fileName the file; may be empty for a new tree
  /// \param description text that a new file carries; may be null
  /// \param stringLookup null
  /// \param openExisting true: load the file
  /// \param flags kRegistryFlags
  TInFileKey(const COrxStringT<wchar_t>& fileName, const wchar_t* description,
             const void* stringLookup, bool openExisting, unsigned flags);
  ~TInFileKey() override;

  /// Appends what changed since the last save to the tree's own file, which is made for a new tree.
  /// The file is written afresh when more than half of it is superseded, and when its index would
  /// end, as what changed is more than new entries. Durable when it returns true. When it returns
  /// false, what was durable stays loadable and the tree keeps its changes for another try;
  /// KeptFileError() tells what the system said.
  /// \param flag no meaning here
  /// \param registryVersion kRegistryVersion
  bool Save(bool flag, unsigned registryVersion);

  /// Writes the whole tree to a new file, whole or not at all; durable when it returns true. A
  /// file that exists is not replaced: false. The tree's own file stays what it was.
  /// \param fileName the new file
  /// \param flag no meaning here
  /// \param registryVersion kRegistryVersion
  bool Save(const COrxStringT<wchar_t>& fileName, bool flag, unsigned registryVersion);

  /// Has the files that this tree is written to find their entries by areas.
  /// \return false when the tree has a file, or the areas are more than kMaxEntryAreas, make no
  /// sense
  ///     or have names of more than 4000 bytes together; the tree is then as it was
  bool IndexBy(const EntryAreas& areas);

  /// True when the tree has changes that no save has made durable.
  bool HasUnsavedChanges() const;
  /// Reads the file again, forgetting unsaved changes. Keys obtained before keep the old tree.
  void Reload();
  /// As Reload(). When the file cannot be read now, the tree is kCannotBeOpened until a Reload().
  void ForgetChanges() noexcept;

 protected:
  /// True when the file is not, or no longer, what was read or saved last.
  bool HasFileChanged() const;

 private:
  bool SaveNew(const std::filesystem::path& path);

  COrxStringT<wchar_t> fileName_;
};

/// A registry file that is shared between users in one process.
class ORXREGISTRY_EXPORT TCSInFileKey : public TInFileKey {
 public:
  using TInFileKey::TInFileKey;
  ~TCSInFileKey() override;

  /// Hold it around every use of the tree.
  boost::recursive_mutex& GetMutex() { return mutex_; }

 private:
  boost::recursive_mutex mutex_;
};

}  // namespace orx
