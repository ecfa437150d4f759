#pragma once

#include <boost/thread/lock_types.hpp>
#include <functional>

#include "ingest/shared_file.h"
#include "orxregistry/in_file_key.h"
#include "orxregistry/registry_key.h"
#include "orxutils/orx_string.h"
#include "velta/result_codes.h"

/// How an entry gets into a datum file or a projection file: the steps that both share.
namespace orx::cs::velta {

/// Writes the values of a key.
using FillKey = std::function<ResultCode(TGenericRegistryKey& key)>;
using CreateFile = std::function<ResultCode(const COrxStringT<wchar_t>& path)>;

/// The full name of the file of a datum.
inline COrxStringT<wchar_t> FileOf(const SharedFiles& kind, const COrxStringT<wchar_t>& directory,
                                   const COrxStringT<wchar_t>& datumName) {
  return directory + datumName + kind.extension;
}

/// Makes sure that the directory and the file exist.
/// \param create called for a file that does not
/// \return 0, kNoDirectory, or what `create` returns
ResultCode EnsureFile(const COrxStringT<wchar_t>& directory, const COrxStringT<wchar_t>& path,
                      const CreateFile& create);

/// Writes a new file with a container key and its first entry. Whether it could be written shows
/// when it is opened.
/// \return 0, the kind's trouble, or what `fillEntry` returns
ResultCode CreateFileWithEntry(const SharedFiles& kind, const COrxStringT<wchar_t>& path,
                               const COrxStringT<wchar_t>& containerName,
                               const FillKey& fillContainer, const COrxStringT<wchar_t>& entryName,
                               const FillKey& fillEntry);

/// Makes the file the kind's current one, without its lock.
/// \return 0, the kind's trouble, or a code of `Obtain`; the file has been given back then
ResultCode OpenShared(const SharedFiles& kind, const COrxStringT<wchar_t>& path);

/// Runs `add` with the lock of the kind's current file, and gives the file back before the lock
/// goes.
template <class Add>
ResultCode AddAndGiveBack(const SharedFiles& kind, const COrxStringT<wchar_t>& path,
                          const Add& add) {
  const boost::unique_lock<boost::recursive_mutex> lock(kind.current->GetMutex());
  const GiveBackLater giveBack(kind, path);
  return add();
}

/// Adds an entry to the kind's current file and saves it, unless the file holds it already. The
/// caller holds the file's lock.
/// \return 0, the kind's trouble, kEntryNotWritten, or what `fill` returns
ResultCode AddEntry(const SharedFiles& kind, const COrxStringT<wchar_t>& name, const FillKey& fill);

}  // namespace orx::cs::velta
