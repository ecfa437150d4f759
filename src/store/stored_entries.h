#pragma once

#include "orxregistry/registry_key.h"
#include "orxutils/orx_string.h"
#include "projmath/rect_rgn.h"
#include "store/stored_key.h"
#include "velta/datum_data.h"

/// Reading the entries of a file, as much of each as is asked for.
namespace orx::cs::velta {

/// Opens a file and its container key, which keeps the file's content alive.
/// \return null when there is no such file or no container key in it
TGenericRegistryKey OpenContainer(const COrxStringT<wchar_t>& fileName);

/// Reads the area of validity from a datum entry's "StandardDatum". An extent of 0 is the whole
/// range.
/// \return false when there is none of the right size
bool ReadValidityArea(const StoredKey& standard, projmath::TRectRgn& area);

/// Reads the rest of "StandardDatum", and the datum's name from the container key. Of the
/// parameters it takes those that the method has.
/// \return false when a value is missing or of another kind, size or dimension
bool ReadTransformation(const StoredKey& container, const StoredKey& standard, DatumData& datum);

/// Reads a whole datum entry, as RTCMGenerator::getAllDatums() gives it.
/// \return false when anything of it is missing or of another kind or size; `datum` is then half
///     filled
bool ReadDatum(const StoredKey& container, const StoredKey& entry, DatumData& datum);

}  // namespace orx::cs::velta
