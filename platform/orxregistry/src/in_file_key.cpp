#include "orxregistry/in_file_key.h"

#include <filesystem>
#include <optional>
#include <utility>

#include "key_tree.h"
#include "orxutils/path.h"
#include "segment_file.h"

namespace orx {
namespace {

std::shared_ptr<KeyTree> Load(const COrxStringT<wchar_t>& fileName) {
  const std::optional<std::filesystem::path> path = ToPath(fileName);
  FileContent content;
  content.error = kCannotBeOpened;
  if (path) content = ReadRegistryFile(*path);
  return std::make_shared<KeyTree>(std::move(content));
}

}  // namespace

TInKey::TInKey(std::shared_ptr<KeyTree> tree) : tree_(std::move(tree)) {}

TInKey::~TInKey() = default;

std::uint32_t TInKey::GetErrorState() const { return tree_->error; }

TInFileKey::TInFileKey(const COrxStringT<wchar_t>& fileName, const wchar_t* description,
                       const void* /*stringLookup*/, bool openExisting, unsigned /*flags*/)
    : TInKey(openExisting ? Load(fileName)
                          : std::make_shared<KeyTree>(ToUtf16(description ? description : L""))),
      fileName_(fileName) {}

TInFileKey::~TInFileKey() = default;

bool TInFileKey::Save(bool /*flag*/, unsigned registryVersion) {
  const std::optional<std::filesystem::path> path = ToPath(fileName_);
  if (!path || registryVersion != kRegistryVersion || tree_->error != kRegistryOk) return false;
  const bool isNew = tree_->position.end == 0;
  if (isNew) return SaveNew(*path);
  const AppendResult result = AppendUnsaved(*path, *tree_);
  if (result == AppendResult::kFailed) return false;
  tree_->MarkSaved();
  // Without a stamp the tree counts as changed, so that it is read again when it is next obtained:
  // it does not have what others have appended, and holds the whole files in memory from which
  // entries were copied into it.
  if (result == AppendResult::kBehindOthers || tree_->HasBorrowed()) {
    tree_->position.stamp = os::FileStamp();
  }
  return true;
}

bool TInFileKey::SaveNew(const std::filesystem::path& path) {
  std::optional<FilePosition> position = SaveNewFile(path, *tree_);
  if (!position) return false;
  tree_->MarkSaved();
  tree_->position = *std::move(position);
  return true;
}

bool TInFileKey::Save(const COrxStringT<wchar_t>& fileName, bool /*flag*/,
                      unsigned registryVersion) {
  const std::optional<std::filesystem::path> path = ToPath(fileName);
  if (!path || registryVersion != kRegistryVersion || tree_->error != kRegistryOk) return false;
  return SaveNewFile(*path, *tree_).has_value();
}

bool TInFileKey::IndexBy(const EntryAreas& areas) {
  if (tree_->position.end != 0 || !format::AreRight(areas)) return false;
  tree_->header().areas = areas;
  return true;
}

bool TInFileKey::HasUnsavedChanges() const { return tree_->HasUnsaved(); }

void TInFileKey::ForgetChanges() noexcept {
  try {
    Reload();
  } catch (...) {
    // The tree shows what is not in the file: it must not be called saved, nor be saved later.
    tree_->MarkSaved();
    tree_->error = kCannotBeOpened;
    tree_->position.stamp = os::FileStamp();
  }
}

bool TInFileKey::HasFileChanged() const {
  const std::optional<std::filesystem::path> path = ToPath(fileName_);
  const std::optional<os::FileStamp> stamp = path ? os::StampOf(*path) : std::nullopt;
  return !stamp || *stamp != tree_->position.stamp;
}

void TInFileKey::Reload() { tree_ = Load(fileName_); }

TCSInFileKey::~TCSInFileKey() = default;

TGenericRegistryKeyPtr::TGenericRegistryKeyPtr(const TInKey& tree)
    : root_(tree.tree_, &tree.tree_->root()) {}

TGenericRegistryKeyPtr::operator TGenericRegistryKeyImpPtr() const { return root_; }

}  // namespace orx
