// Merging another datum or projection file into a shared one.

#include <boost/thread/lock_types.hpp>

#include "ingest/shared_file.h"
#include "orxregistry/in_file_key.h"
#include "orxregistry/registry_key.h"
#include "store/registry_tree.h"
#include "velta/rtcm_data_support.h"

namespace orx::cs::velta {
namespace {

using MergeContainers = ResultCode(TGenericRegistryKey& target, TGenericRegistryKey& source);

ResultCode MergeEntries(const SharedFiles& kind, const TGenericRegistryKey& target,
                        const TGenericRegistryKey& source) {
  if (target.IsNull() || source.IsNull()) return kind.trouble;
  for (TGenRegKeyIterator walk(source); walk;) {
    const TGenericRegistryKey from(walk++);
    if (from.IsNull()) return kind.trouble;
    TGenericRegistryKey to(target, from.GetName(), 0, true);
    if (!to.IsNull()) to.DeepCopy(from);
  }
  return kSuccess;
}

ResultCode MergeFiles(const SharedFiles& kind, const COrxStringT<wchar_t>& targetPath,
                      const COrxStringT<wchar_t>& sourcePath, MergeContainers* merge) {
  TCSInFileKey* target = nullptr;
  const ResultCode obtained = ObtainTree(kind, targetPath, &target);
  if (obtained != kSuccess) return obtained;
  const boost::unique_lock<boost::recursive_mutex> lock(target->GetMutex());
  ReadIfLost(*target);
  TGenericRegistryKey targetContainer = ContainerOf(*target);
  if (targetContainer.IsNull()) return kind.trouble;

  const TCSInFileKey source(sourcePath, kTreeDescription, nullptr, true, kRegistryFlags);
  if (source.GetErrorState() != kRegistryOk) return kind.trouble;
  TGenericRegistryKey sourceContainer = ContainerOf(source);
  if (sourceContainer.IsNull()) return kind.trouble;
  // Damage inside a key shows only when the key is looked into: all of them before the target is
  // touched.
  sourceContainer.LookInto();
  if (source.GetErrorState() != kRegistryOk) return kind.trouble;
  Change change(*target);
  if (!change.IsAlone()) return kind.trouble;
  if (merge(targetContainer, sourceContainer) != kSuccess) return kind.trouble;
  return change.Save() ? kSuccess : kind.trouble;
}

}  // namespace

ResultCode RTCMDataSupport::MergeRTCMDatumfiles(const COrxStringT<wchar_t>& target,
                                                const COrxStringT<wchar_t>& source) {
  const GiveBackLater giveBack(kDatumFiles, target);
  return _MergeRTCMDatumfiles(target, source);
}

ResultCode RTCMDataSupport::_MergeRTCMDatumfiles(const COrxStringT<wchar_t>& target,
                                                 const COrxStringT<wchar_t>& source) {
  return MergeFiles(kDatumFiles, target, source, &RTCMDataSupport::MergeRTCMDatumfiles);
}

ResultCode RTCMDataSupport::MergeRTCMDatumfiles(TGenericRegistryKey& target,
                                                TGenericRegistryKey& source) {
  return MergeEntries(kDatumFiles, target, source);
}

ResultCode RTCMDataSupport::MergeRTCMProjectionfiles(const COrxStringT<wchar_t>& target,
                                                     const COrxStringT<wchar_t>& source) {
  const GiveBackLater giveBack(kProjectionFiles, target);
  return _MergeRTCMProjectionfiles(target, source);
}

ResultCode RTCMDataSupport::_MergeRTCMProjectionfiles(const COrxStringT<wchar_t>& target,
                                                      const COrxStringT<wchar_t>& source) {
  return MergeFiles(kProjectionFiles, target, source, &RTCMDataSupport::MergeRTCMProjectionfiles);
}

ResultCode RTCMDataSupport::MergeRTCMProjectionfiles(TGenericRegistryKey& target,
                                                     TGenericRegistryKey& source) {
  return MergeEntries(kProjectionFiles, target, source);
}

}  // namespace orx::cs::velta
