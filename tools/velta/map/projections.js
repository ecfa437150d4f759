// Projections: from degrees, or metres of a plane, to a flat picture and back. A picture has x to
// the right and y down, one unit of it is a degree of latitude or a metre.

const kPolarFrom = 80;  // degrees of latitude, from where parallels must be round
const kArcStep = 2;     // degrees of longitude that may be a straight line where parallels are round

// Metres as they are.
function planeView() {
  return {
    isStraight: true,
    forward: (east, north) => [east, -north],
    inverse: (x, y) => [x, -y],
    northward: () => [0, -1],
    unitWidth: () => 1,
  };
}

// Degrees as a plate, true to shape in the middle latitude.
function plateView(latitude) {
  const aspect = Math.cos(radians(latitude));
  return {
    isStraight: true,
    forward: (east, north) => [east * aspect, -north],
    inverse: (x, y) => [x / aspect, -y],
    northward: () => [0, -1],
    unitWidth: () => aspect,
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
  };
}

// The picture for what is looked at first, and all that is to be seen of it.
function globeView(focus, all, middle) {
  const north = Math.max(focus.north, all.north);
  const south = Math.min(focus.south, all.south);
  if (north > kPolarFrom && south > 0) return polarView(1, middle);
  if (south < -kPolarFrom && north < 0) return polarView(-1, middle);
  return plateView((focus.south + focus.north) / 2);
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
