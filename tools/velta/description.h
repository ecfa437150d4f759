#pragma once

#include <nlohmann/json.hpp>
#include <span>
#include <string>
#include <string_view>
#include <vector>

#include "velta/datum_data.h"
#include "velta/message_units.h"
#include "velta/table_data.h"

namespace velta_tool {

inline constexpr double kPi = orx::cs::velta::kWholeLatitude;
inline constexpr double kDegreesPerRadian = 180 / kPi;
inline constexpr double kArcSecondsPerRadian = kDegreesPerRadian * 3600;
inline constexpr std::string_view kDegrees = "degrees";

/// One thing to say about an entry.
struct Property {
  const char* label;             ///< for people
  const char* key;               ///< for JSON
  nlohmann::ordered_json value;  ///< number, text, or an array or an object of them
  std::string_view unit = {};
  double step = 0;  ///< of the message's field; what is much smaller is rounding
};
using Description = std::vector<Property>;

/// Edges of an area in degrees, the whole range of latitude or longitude from -90 or -180.
struct Edges {
  double south;
  double north;
  double west;
  double east;

  /// \param area south edge, extent in latitude, west edge, extent in longitude, radians
  explicit Edges(std::span<const double> area);
};

/// A datum entry: angles in degrees, rotations and residuals of angles in arc-seconds, the scale
/// correction in ppm, lengths in metres.
Description Describe(const orx::cs::velta::DatumData& datum);

/// A projection entry as it is stored.
struct StoredProjection {
  std::wstring type;  ///< type string
  std::wstring datumName;
  double axes[2] = {};         ///< of the ellipsoid, metres
  double parameters[16] = {};  ///< degrees, metres, plain ratios
  orx::cs::velta::TableData grid;
};

/// A projection entry: angles in degrees, lengths in metres, the scale as a factor.
Description Describe(const StoredProjection& projection);

/// The labels of what differs by more than the rounding of its computation.
std::vector<std::string> DifferingLabels(const Description& a, const Description& b);

/// A description with its angles in degrees, minutes and seconds.
Description WithDegreesMinutesSeconds(Description description);

/// A description as lines of text.
std::string ToText(const Description& description);

/// Many descriptions on a screen: what most share, their number, then a line for each with what it
/// has of its own or otherwise. The points of residual grids are left out.
/// \param descriptions at least two, each beginning with the entry's name
std::string ToSummary(const std::vector<Description>& descriptions);

/// A description as a JSON object.
nlohmann::ordered_json ToJson(const Description& description);

}  // namespace velta_tool
