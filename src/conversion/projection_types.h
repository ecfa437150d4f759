#pragma once

#include <memory>
#include <string_view>

#include "projmath/geo_proj.h"
#include "velta/projection_data.h"

namespace orx::cs::velta {

/// A type code with what belongs to it.
struct ProjectionType {
  ProjectionData::projList code;
  const wchar_t* name;  ///< the type string, which several codes may share
  /// Makes the projection object, null when memory is out. Itself null for a type that is known
  /// and not supported.
  std::unique_ptr<projmath::TGeoProj> (*make)(double a, double second);
};

/// \return null for a code without a type string
const ProjectionType* FindProjectionType(int code);

/// The first code of a type string, ignoring case; NONE for an unknown one.
ProjectionData::projList FirstCodeOf(std::wstring_view name);

}  // namespace orx::cs::velta
