#pragma once

#include "velta/datum_data.h"
#include "velta/projection_data.h"

/// Whether two descriptions are of the same thing.
namespace orx::cs::velta {

/// Parameters may differ by 1e-5, rotations by 1e-7; names are compared ignoring case. The area of
/// validity and the grid do not count.
bool IsSameDatum(const DatumData& a, const DatumData& b);

/// Parameters may differ by 1e-7; the type is compared ignoring case, the name is not. Without a
/// projection object a description equals none, not even itself.
bool ProjectionEquals(const ProjectionData& a, const ProjectionData& b);

}  // namespace orx::cs::velta
