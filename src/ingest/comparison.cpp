#include "ingest/comparison.h"

#include <cmath>
#include <iterator>

namespace orx::cs::velta {
namespace {

constexpr double kDatumTolerance = 1e-5;       // metres, ppm
constexpr double kRotationTolerance = 1e-7;    // arc-seconds
constexpr double kProjectionTolerance = 1e-7;  // degrees, metres, ratios
constexpr std::size_t kFirstRotation = 3;
constexpr std::size_t kLastRotation = 5;

bool IsSameEllipsoid(const projmath::Ellipsoid& a, const projmath::Ellipsoid& b) {
  return a.a == b.a && a.second == b.second;
}

bool AreSameParameters(const DatumData& a, const DatumData& b) {
  for (std::size_t i = 0; i < std::size(a.parameters); ++i) {
    const bool isRotation = i >= kFirstRotation && i <= kLastRotation;
    const double tolerance = isRotation ? kRotationTolerance : kDatumTolerance;
    if (!(std::abs(a.parameters[i] - b.parameters[i]) <= tolerance)) return false;
  }
  return true;
}

}  // namespace

bool IsSameDatum(const DatumData& a, const DatumData& b) {
  return AreSameParameters(a, b) && IsSameEllipsoid(a.sourceEllipsoid, b.sourceEllipsoid) &&
         IsSameEllipsoid(a.targetEllipsoid, b.targetEllipsoid) &&
         a.computationIndicator == b.computationIndicator &&
         EqualsIgnoringCase(a.targetDatumName, b.targetDatumName) &&
         EqualsIgnoringCase(a.sourceDatumName, b.sourceDatumName);
}

bool ProjectionEquals(const ProjectionData& a, const ProjectionData& b) {
  if (a.rtcmProjName != b.rtcmProjName || !EqualsIgnoringCase(a.prjType, b.prjType)) return false;
  if (!a.geoProj || !b.geoProj) return false;
  const projmath::TGeoProj& p = *a.geoProj;
  const projmath::TGeoProj& q = *b.geoProj;
  if (p.parameterCount != q.parameterCount) return false;
  for (int i = 0; i < p.parameterCount; ++i) {
    const double difference = p.GetParam(i, projmath::kDegreesMetresRatios) -
                              q.GetParam(i, projmath::kDegreesMetresRatios);
    if (std::abs(difference) > kProjectionTolerance) return false;
  }
  return p.semiMajorAxis == q.semiMajorAxis && p.ellipsoidSecond == q.ellipsoidSecond;
}

}  // namespace orx::cs::velta
