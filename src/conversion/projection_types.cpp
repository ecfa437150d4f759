#include "conversion/projection_types.h"

#include <algorithm>
#include <iterator>
#include <new>

namespace orx::cs::velta {
namespace {

/// Makes a projection of a class with its construction arguments after the ellipsoid's.
template <class Projection, int... arguments>
std::unique_ptr<projmath::TGeoProj> Make(double a, double second) {
  return std::unique_ptr<projmath::TGeoProj>(new (std::nothrow)
                                                 Projection(a, second, double{arguments}...));
}

constexpr auto* kTransverseMercator = &Make<projmath::TUTMProj, 0, 1, 0, 0, 0>;
constexpr auto* kCassini = &Make<projmath::TCassiniProj, 0, 0, 0, 0, 0>;
constexpr auto* kObliqueMercator = &Make<projmath::TOMercatorProj, 0, 1, 0, 0, 0, 0, 0>;
constexpr auto* kStereographic = &Make<projmath::TSterProj, 0, 0, 1, 0, 0>;
constexpr auto* kMercator = &Make<projmath::TMercatorProj, 0, 0, 0, 0>;
constexpr auto* kRectified = &Make<projmath::TROMercatorProj, 0, 1, 0, 0, 0, 0, 0>;

constexpr ProjectionType kTypes[] = {
    {ProjectionData::TM, L"TMERC", kTransverseMercator},
    {ProjectionData::TMS, L"TMERC", kTransverseMercator},
    {ProjectionData::LCC1SP, L"LC", nullptr},
    {ProjectionData::LCC2SP, L"LC", nullptr},
    {ProjectionData::LCCW, L"LC", nullptr},
    {ProjectionData::CS, L"CASSINI", kCassini},
    {ProjectionData::OM, L"OM", kObliqueMercator},
    {ProjectionData::OS, L"STER", kStereographic},
    {ProjectionData::MC, L"MERCATOR", kMercator},
    {ProjectionData::PS, L"STER", kStereographic},
    {ProjectionData::ROM, L"ROM", kRectified},
};

}  // namespace

const ProjectionType* FindProjectionType(int code) {
  const auto* const found = std::find_if(std::begin(kTypes), std::end(kTypes),
                                         [=](const auto& type) { return type.code == code; });
  return found == std::end(kTypes) ? nullptr : found;
}

ProjectionData::projList FirstCodeOf(std::wstring_view name) {
  const auto* const found = std::find_if(std::begin(kTypes), std::end(kTypes), [=](const auto& t) {
    return EqualsIgnoringCase(t.name, name);
  });
  return found == std::end(kTypes) ? ProjectionData::NONE : found->code;
}

}  // namespace orx::cs::velta
