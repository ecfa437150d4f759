// The graticule: lines of round degrees or metres behind the map, and their labels on its edges.

const kLineDistance = 96;  // pixels from line to line, at least
const kLabelGap = 12;      // pixels between labels of an edge
const kEdgeSample = 6;     // pixels

// Distances of lines in degrees are to divide the circle.
function roundStep(number, isPlane) {
  if (isPlane || number <= 5) return roundUp(number);
  return [10, 15, 30, 45, 90].find((step) => step >= number) ?? 90;
}

// Places along the edges of the map, and where they are on earth.
function edgePoints(sheet, plot) {
  const points = {bottom: [], left: [], right: [], top: []};
  const add = (side, x, y) => points[side].push({x, y, at: toEarth(sheet, x, y)});
  const along = (length) => Math.max(2, Math.ceil(length / kEdgeSample));
  for (let i = 0, n = along(plot.width); i <= n; ++i) {
    add("bottom", plot.left + plot.width * i / n, plot.bottom);
    add("top", plot.left + plot.width * i / n, plot.top);
  }
  for (let i = 0, n = along(plot.height); i <= n; ++i) {
    add("left", plot.left, plot.bottom - plot.height * i / n);
    add("right", plot.right, plot.bottom - plot.height * i / n);
  }
  return points;
}

// What of the earth is in view: from its edges, and from the pole if that is in view.
function earthInView(sheet, points, plot) {
  const seen = hull(Object.values(points).flat()
      .map(({at: [east, north]}) => ({south: north, north, west: east, east})));
  const {pole} = sheet.projection;
  seen.south = Math.max(seen.south, sheet.isPlane ? -Infinity : -90);
  seen.north = Math.min(seen.north, sheet.isPlane ? Infinity : 90);
  if (!pole && !sheet.isPlane) {
    seen.west = Math.max(seen.west, sheet.middle - 180);
    seen.east = Math.min(seen.east, sheet.middle + 180);
  }
  if (!pole) return seen;
  const [x, y] = toScreen(sheet, 0, 90 * pole);
  const isPoleIn = x > plot.left && x < plot.right && y > plot.top && y < plot.bottom;
  if (isPoleIn) seen[pole > 0 ? "north" : "south"] = 90 * pole;
  // Around the pole, and across the meridian where longitudes begin anew.
  if (isPoleIn || seen.east - seen.west > 180) {
    seen.west = -180;
    seen.east = 180 - 1e-9;
  }
  return seen;
}

function multiplesIn(from, to, step) {
  const multiples = [];
  for (let i = Math.ceil(from / step - 1e-9); i * step <= to; ++i) multiples.push(i * step);
  return multiples;
}

// A coordinate as a label: 51.95° N, 350 000 m E.
function coordinateText(value, step, isPlane, isNorth) {
  const decimals = Math.max(0, -Math.floor(Math.log10(step) + 1e-9));
  if (isPlane) return `${numberText(value, decimals)}\u00a0m\u00a0${isNorth ? "N" : "E"}`;
  const degrees = isNorth ? value : value - 360 * Math.round(value / 360);
  const letter = Math.abs(degrees) < step / 2 || (!isNorth && Math.abs(degrees) === 180) ?
      "" : isNorth ? (degrees < 0 ? "S" : "N") : degrees < 0 ? "W" : "E";
  return `${numberText(Math.abs(degrees), decimals)}°${letter && "\u00a0"}${letter}`;
}

// Labels where lines meet an edge.
function edgeLabels({projection, isPlane}, points, steps) {
  const labels = [];
  for (let i = 1; i < points.length; ++i) {
    if (!projection.has(...points[i].at)) continue;
    for (const isNorth of [true, false]) {
      const step = isNorth ? steps.north : steps.east;
      const [from, to] = [points[i - 1], points[i]].map(({at}) => at[isNorth ? 1 : 0]);
      if (!isNorth && !isPlane && Math.abs(to - from) > 180) continue;
      const line = step * (to > from ? Math.ceil(from / step) : Math.floor(from / step));
      if (line === from && i > 1) continue;  // has been met
      const share = (line - from) / (to - from);
      if (!(share >= 0 && share <= 1)) continue;
      labels.push({
        x: points[i - 1].x + share * (points[i].x - points[i - 1].x),
        y: points[i - 1].y + share * (points[i].y - points[i - 1].y),
        text: coordinateText(line, step, isPlane, isNorth)});
    }
  }
  return labels;
}

// Leaves out labels that have no room on their edge.
function withRoom(labels, along, from, to) {
  const kept = [];
  let free = from;
  for (const label of labels.sort((a, b) => a[along] - b[along])) {
    const half = label.text.length * kLetterWidth / 2;
    if (label[along] - half < free || label[along] + half > to) continue;
    free = label[along] + half + kLabelGap;
    kept.push(label);
  }
  return kept;
}

// The graticule of the map as it is seen: a path, and labels of the bottom and the left edge.
function graticule(sheet, plot) {
  const {projection, isPlane} = sheet;
  const points = edgePoints(sheet, plot);
  const seen = earthInView(sheet, points, plot);
  const centre = (seen.south + seen.north) / 2;
  const widest = kLineDistance / sheet.view.scale;
  const steps = {
    north: roundStep(widest, isPlane),
    east: roundStep(widest / projection.unitWidth(centre), isPlane)};
  const samples = projection.isStraight ? 1 : 64;
  const line = (from, to) => {
    let path = "";
    for (let i = 0; i <= samples; ++i) {
      const share = i / samples;
      const [x, y] = toScreen(
          sheet, from[0] + share * (to[0] - from[0]), from[1] + share * (to[1] - from[1]));
      path += `${i ? "L" : "M"}${tenth(x)} ${tenth(y)}`;
    }
    return path;
  };
  let path = "";
  const {south, north} = seen;
  for (const latitude of multiplesIn(south, north, steps.north)) {
    path += line([seen.west, latitude], [seen.east, latitude]);
  }
  for (const longitude of multiplesIn(seen.west, seen.east, steps.east)) {
    path += line([longitude, south], [longitude, north]);
  }
  return {
    path,
    bottom: withRoom(edgeLabels(sheet, points.bottom, steps), "x", plot.left, plot.right),
    left: withRoom(edgeLabels(sheet, points.left, steps), "y", plot.top, plot.bottom)};
}
