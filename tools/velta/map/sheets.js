// Sheets: what one tab shows, unpacked from the page's data.

const kArcSecondsPerDegree = 3600;
const kMillimetresPerMetre = 1000;
const kEarthRadius = 6371000;  // metres; the residuals that are drawn need no ellipsoid
const kMetresPerArcSecond = kEarthRadius * Math.PI / 180 / kArcSecondsPerDegree;
const kGridPoints = 4;         // rows, and columns, of a window
const kPoints = kGridPoints * kGridPoints;
const kParts = 3;              // north, east, height
const [kNorth, kEast, kHeight] = [0, 1, 2];

const radians = (degrees) => degrees * Math.PI / 180;

// An area of the map, with longitudes or eastings that only grow to the east.
function toBox(place, at, unitsPerDegree) {
  const [south, northExtent, west, eastExtent] =
      place.slice(at, at + 4).map((number) => number / unitsPerDegree);
  return {south, north: south + northExtent, west, east: west + eastExtent};
}

const isWholeLatitude = (box) => box.north - box.south >= 180;
const isWholeLongitude = (box) => box.east - box.west >= 360;

// The longitude in the middle of what the boxes cover: opposite the widest gap between them.
function middleLongitude(boxes) {
  const turn = (degrees) => (degrees % 360 + 360) % 360;
  const spans = boxes.filter((box) => !isWholeLongitude(box))
      .map((box) => [turn(box.west), box.east - box.west])
      .sort((a, b) => a[0] - b[0]);
  if (spans.length === 0) return 0;
  let end = spans[0][0];
  let gap = -1;
  let middle = 0;
  for (const [west, extent] of [...spans, [spans[0][0] + 360, 0]]) {
    if (west - end > gap) {
      gap = west - end;
      middle = west - gap / 2 + 180;
    }
    end = Math.max(end, west + extent);
  }
  return Math.round(turn(middle + 180)) - 180;
}

// Turns a box of degrees to where it is on a map around a longitude, and ends it at the poles.
function placeOnGlobe(box, middle) {
  if (isWholeLatitude(box)) [box.south, box.north] = [-90, 90];
  if (isWholeLongitude(box)) [box.west, box.east] = [middle - 180, middle + 180];
  const turns = 360 * Math.round(((box.west + box.east) / 2 - middle) / 360);
  box.west -= turns;
  box.east -= turns;
  box.south = Math.max(box.south, -90);
  box.north = Math.min(box.north, 90);
}

// All that boxes cover.
function hull(boxes) {
  const all = {south: Infinity, north: -Infinity, west: Infinity, east: -Infinity};
  for (const box of boxes) {
    all.south = Math.min(all.south, box.south);
    all.north = Math.max(all.north, box.north);
    all.west = Math.min(all.west, box.west);
    all.east = Math.max(all.east, box.east);
  }
  return all;
}

// Residuals of all windows, in millimetres on the ground: for each window its 16 north, east and
// height residuals with the mean taken off, and the three means.
function toGround(columns, windows, isPlane) {
  const points = new Float32Array(windows.length * kParts * kPoints);
  const means = new Float32Array(windows.length * kParts);
  windows.forEach((window, index) => {
    const perUnit = isPlane ? 1 : kMetresPerArcSecond;
    const alongParallel = isPlane ? 1 : Math.cos(radians((window.south + window.north) / 2));
    const factors = [
      kMillimetresPerMetre * perUnit / columns.residualUnits,
      kMillimetresPerMetre * perUnit * alongParallel / columns.residualUnits,
      kMillimetresPerMetre / columns.heightUnits];
    for (let part = 0; part < kParts; ++part) {
      const at = index * kParts + part;
      means[at] = columns.means[at] * factors[part];
      for (let point = 0; point < kPoints; ++point) {
        points[at * kPoints + point] = columns.residuals[at * kPoints + point] * factors[part];
      }
    }
  });
  return {points, means};
}

function makeSheet(columns, isPlane) {
  const unitsPerDegree = isPlane ? 1 : kArcSecondsPerDegree;
  const files = columns.files.map((name, index) => {
    const {source, target, heightIndicators} = columns.systems[index];
    const systems = target ? `from ${source} to ${target}` : "";
    return {name, systems, heightIndicators, isShown: true};
  });
  const areas = columns.areas.map((area) => ({
    ...toBox(area.place, 0, unitsPerDegree),
    file: files[area.file], entries: area.entries, unusable: area.unusable}));
  const windows = columns.entries.map((entry, index) => ({
    ...toBox(columns.places, 4 * index, unitsPerDegree),
    index, entry, file: files[columns.fileOf[index]],
    methods: columns.methods.slice(2 * index, 2 * index + 2),
    problem: columns.problems[index]}));
  for (const window of windows) {
    window.northStep = (window.north - window.south) / (kGridPoints - 1);
    window.eastStep = (window.east - window.west) / (kGridPoints - 1);
    window.top = window.north;  // of its points, wherever the globe ends
    window.hasVectors = !window.problem && window.methods[0] >= 0;
    window.hasHeights = !window.problem && window.methods[1] >= 0;
  }
  const boxes = [...areas, ...windows];
  const middle = isPlane ? 0 : middleLongitude(boxes);
  if (!isPlane) boxes.forEach((box) => placeOnGlobe(box, middle));
  const sheet = {isPlane, files, areas, windows, middle, columns,
                 ...toGround(columns, windows, isPlane), withoutMeans: false,
                 projection: null, view: null, selected: null, hovered: null};
  sheet.projection = viewOf(sheet, everything(sheet));
  sheet.limits = limitsOf(sheet);
  measure(sheet);
  return sheet;
}

// A residual as it is shown: with the mean of its window, or as the deviation from it.
function residualOf(sheet, window, part, point) {
  const at = window.index * kParts + part;
  return sheet.points[at * kPoints + point] + (sheet.withoutMeans ? 0 : sheet.means[at]);
}

// The mean of a window's residuals as they are shown.
function middleOf(sheet, window, part) {
  const at = window.index * kParts + part;
  let sum = 0;
  for (let point = 0; point < kPoints; ++point) sum += sheet.points[at * kPoints + point];
  return sum / kPoints + (sheet.withoutMeans ? 0 : sheet.means[at]);
}
