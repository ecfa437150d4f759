// Projections: from degrees, or metres of a plane, to a flat picture and back. A picture has x to
// the right and y down, one unit of it is a degree of latitude or a metre.

const kPolarFrom = 75;      // degrees of latitude, from where parallels must be round
const kPolarUntil = 65;     // and until where they stay so
const kMostStretch = 1.02;  // of the picture's middle, to the east
const kArcStep = 2;         // degrees of longitude that may be a straight line where parallels are round

// Metres as they are.
function planeView() {
  return {
    isStraight: true,
    forward: (east, north) => [east, -north],
    inverse: (x, y) => [x, -y],
    northward: () => [0, -1],
    unitWidth: () => 1,
    has: () => true,
  };
}

// Degrees as a plate, true to shape at a latitude; 180 degrees to each side of a longitude.
function plateView(latitude, middle) {
  const aspect = Math.cos(radians(latitude));
  return {
    isStraight: true,
    aspect,
    forward: (east, north) => [east * aspect, -north],
    inverse: (x, y) => [x / aspect, -y],
    northward: () => [0, -1],
    unitWidth: () => aspect,
    has: (east, north) => Math.abs(north) <= 90 && Math.abs(east - middle) <= 180,
  };
}

// Degrees around a pole, with true distances from it.
// pole: 1 the north pole, -1 the south pole; middle: the longitude that points to the viewer
function polarView(pole, middle) {
  const angle = (east) => radians(east - middle);
  return {
    isStraight: false,
    pole,
    forward(east, north) {
      const distance = 90 - pole * north;
      return [distance * Math.sin(angle(east)), pole * distance * Math.cos(angle(east))];
    },
    inverse(x, y) {
      const east = middle + Math.atan2(x, pole * y) * 180 / Math.PI;
      return [east, pole * (90 - Math.hypot(x, y))];
    },
    northward: (east) => [-pole * Math.sin(angle(east)), -Math.cos(angle(east))],
    unitWidth: (north) => Math.max(radians(90 - pole * north), 1e-6),
    has: (east, north) => Math.abs(north) <= 90,
  };
}

// The picture that is true to shape around a place, with north up there.
// middle: the longitude that a map of all longitudes has in its middle
function globeView([east, north], middle) {
  if (Math.abs(north) > kPolarFrom) return polarView(Math.sign(north), east);
  return plateView(north, middle);
}

// The picture for all of some boxes: around the pole where they lie around it.
function viewOf({isPlane, middle}, boxes) {
  if (isPlane) return planeView();
  const {south, north, west, east} = hull(boxes);
  const isAround = east - west >= 180;
  const pole = isAround && south > 0 && north > kPolarFrom ? 1 :
      isAround && north < 0 && south < -kPolarFrom ? -1 : 0;
  return globeView([(west + east) / 2, pole ? 90 * pole : (south + north) / 2], middle);
}

// Whether a picture is true enough to shape around a place.
function suits(projection, [, north]) {
  if (projection.pole) return projection.pole * north > kPolarUntil;
  const stretch = Math.cos(radians(north)) / projection.aspect;
  return Math.abs(north) <= kPolarFrom && stretch < kMostStretch && stretch > 1 / kMostStretch;
}

// The outline of a box in the picture: rings of points.
function ringsOf(projection, box) {
  const {south, north, west, east} = box;
  const steps = projection.isStraight ? 1 : Math.max(1, Math.ceil((east - west) / kArcStep));
  const parallel = (latitude, from, to) => {
    const points = [];
    for (let i = 0; i <= steps; ++i) {
      points.push(projection.forward(from + (to - from) * i / steps, latitude));
    }
    return points;
  };
  if (!projection.isStraight && isWholeLongitude(box)) {
    return [parallel(south, west, east), parallel(north, east, west)];
  }
  return [[...parallel(south, west, east), ...parallel(north, east, west)]];
}
