#include "entry_bounds.h"

#include <algorithm>
#include <cmath>
#include <cstring>
#include <limits>
#include <string>

namespace orx {
namespace {

using record::Content;
using record::KeyRecord;
using record::Part;
using record::ValueRecord;

constexpr float kInfinity = std::numeric_limits<float>::infinity();
constexpr float kLargest = std::numeric_limits<float>::max();

record::Name NameOf(const std::u16string& text) {
  return {reinterpret_cast<const unsigned char*>(text.data()), text.size() * sizeof(char16_t)};
}

/// The only one of a name among the values or the keys of a part; none when there is no such, or
/// one of them is not whole.
template <class Record>
Record FindOnly(Part part, Record (*take)(Part&), const std::u16string& name) {
  Record only;
  while (!part.shapes.empty()) {
    const Record record = take(part);
    if (!record) return {};
    if (!(record.name() == NameOf(name))) continue;
    if (only) return {};
    only = record;
  }
  return only;
}

float Down(double value) {
  if (value > kLargest) return kLargest;
  if (value < -kLargest) return -kInfinity;
  const auto nearest = static_cast<float>(value);
  return nearest <= value ? nearest : std::nextafter(nearest, -kInfinity);
}

float Up(double value) { return -Down(-value); }

/// False for edges that are no numbers, and for extents that hold nothing or may mean something
/// else.
bool IsArea(const double (&area)[4], bool isZeroUnknown) {
  for (std::size_t axis = 0; axis < 2; ++axis) {
    const double extent = area[2 * axis + 1];
    if (!std::isfinite(area[2 * axis] + extent) || !std::isfinite(extent)) return false;
    if (extent < 0.0 || (extent == 0.0 && isZeroUnknown)) return false;
  }
  return true;
}

}  // namespace

const Bounds kEverything{{-kInfinity, -kInfinity}, {kInfinity, kInfinity}};

void Bounds::Include(const Bounds& other) {
  for (int axis = 0; axis < 2; ++axis) {
    low[axis] = std::min(low[axis], other.low[axis]);
    high[axis] = std::max(high[axis], other.high[axis]);
  }
}

AreaPlaces::AreaPlaces(const EntryAreas& areas, const Content& content) {
  for (std::size_t i = 0; i < areas.size(); ++i) FindPlace(areas[i], i, content);
}

bool AreaPlaces::HasAny() const {
  return std::any_of(places_.begin(), places_.end(), [](const auto& place) { return !!place; });
}

void AreaPlaces::FindPlace(const EntryArea& area, std::size_t number, const Content& content) {
  const KeyRecord key = FindOnly(content.keys(), record::TakeKey, area.key);
  if (!key) return;
  Part values = key.content().values();
  for (const std::u16string& needed : area.needed) {
    if (!FindOnly(values, record::TakeValue, needed)) return;
  }
  const ValueRecord found = FindOnly(values, record::TakeValue, area.value);
  if (!found || found.value().elementSize != area.bytes) return;
  const auto placeOf = [&](ValueRecord value) {
    return static_cast<std::size_t>(value.data().data() - content.data().data());
  };
  places_[number] = {placeOf(found), area.isZeroUnknown};
  while (!values.shapes.empty()) {
    const ValueRecord value = record::TakeValue(values);
    if (value.value().elementSize == 0) texts_.push_back({placeOf(value), value.data().size()});
  }
}

EntryBounds AreaPlaces::BoundsIn(record::Bytes data) const {
  EntryBounds bounds;
  bounds.fill(kEverything);
  const bool isWhole = std::all_of(texts_.begin(), texts_.end(), [&](const Text& text) {
    return record::IsTerminatedText(data.data() + text.place, text.bytes);
  });
  for (std::size_t i = 0; isWhole && i < bounds.size(); ++i) {
    if (!places_[i]) continue;
    double area[4];
    std::memcpy(area, data.data() + places_[i]->place, sizeof area);
    if (!IsArea(area, places_[i]->isZeroUnknown)) continue;
    for (std::size_t axis = 0; axis < 2; ++axis) {
      const double edge = area[2 * axis];
      bounds[i].low[axis] = Down(edge);
      bounds[i].high[axis] = Up(edge + area[2 * axis + 1]);
    }
  }
  return bounds;
}

}  // namespace orx
