#include "ingest/entry_file.h"

#include "orxutils/file_funcs.h"
#include "store/registry_tree.h"

namespace orx::cs::velta {

ResultCode EnsureFile(const COrxStringT<wchar_t>& directory, const COrxStringT<wchar_t>& path,
                      const CreateFile& create) {
  if (!FileFuncs::isDirExists(directory) && !FileFuncs::createDirectoryTree(directory)) {
    return kNoDirectory;
  }
  return FileFuncs::isFileExists(path) ? kSuccess : create(path);
}

ResultCode CreateFileWithEntry(const SharedFiles& kind, const COrxStringT<wchar_t>& path,
                               const COrxStringT<wchar_t>& containerName,
                               const FillKey& fillContainer, const COrxStringT<wchar_t>& entryName,
                               const FillKey& fillEntry) {
  TCSInFileKey tree(L"", kTreeDescription, nullptr, false, kRegistryFlags);
  if (tree.GetErrorState() != kRegistryOk) return kind.trouble;
  tree.IndexBy(kind.areas());
  const TGenericRegistryKey root{TGenericRegistryKeyPtr(tree)};
  TGenericRegistryKey container(root, containerName, 0, true);
  fillContainer(container);
  TGenericRegistryKey entry(container, entryName, 0, true);
  const ResultCode result = fillEntry(entry);
  if (result == kSuccess) tree.Save(path, false, kRegistryVersion);
  return result;
}

ResultCode OpenShared(const SharedFiles& kind, const COrxStringT<wchar_t>& path) {
  kind.current = nullptr;
  ResultCode result = ObtainTree(kind, path, &kind.current);
  if (result == kSuccess) {
    // Somebody else may have it read again just now.
    const boost::unique_lock<boost::recursive_mutex> lock(kind.current->GetMutex());
    if (kind.current->GetErrorState() != kRegistryOk) result = kind.trouble;
  }
  if (result != kSuccess) GiveBack(kind, path);
  return result;
}

ResultCode AddEntry(const SharedFiles& kind, const COrxStringT<wchar_t>& name,
                    const FillKey& fill) {
  TCSInFileKey& file = *kind.current;
  ReadIfLost(file);
  const TGenericRegistryKey container = ContainerOf(file);
  const bool isPresent = container.HasKey(name);
  // Damage inside a key shows only when the key has been looked into.
  if (container.IsNull() || file.GetErrorState() != kRegistryOk) return kind.trouble;
  if (isPresent) return kSuccess;
  Change change(file);
  if (!change.IsAlone()) return kEntryNotWritten;
  TGenericRegistryKey entry(container, name, container.GetKeyDim(), true);
  const ResultCode result = fill(entry);
  if (result != kSuccess) return result;
  return change.Save() ? kSuccess : kEntryNotWritten;
}

}  // namespace orx::cs::velta
