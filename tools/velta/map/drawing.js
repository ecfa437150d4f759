// Drawing: the map of a sheet as it is in view. What is far away is drawn simply: a window is one
// colour, then an outline with one arrow, then 16 points with theirs, then numbers at them.

const kMargins = {left: 24, right: 8, top: 8, bottom: 24};  // pixels, for the graticule's labels
const kSmallest = 3;            // pixels that a window has, however far away
const kOutlineFrom = 8;         // pixels of a window's shorter side
const kArrowFrom = 32;
const kPointsFrom = 100;
const kNumbersFrom = 240;
const kMostNear = 250;          // windows that are drawn with points; of more, nothing can be read
const kMostArrows = 3000;
const kMostSilhouettes = 2000;  // behind the colours, so that a few far windows are seen at all
const kLabelHeight = 14;        // pixels
const kLetterWidth = 6.6;       // pixels, on the safe side

const svgSpace = "http://www.w3.org/2000/svg";

function svgElement(name, attributes, ...children) {
  const element = document.createElementNS(svgSpace, name);
  for (const [key, value] of Object.entries(attributes)) element.setAttribute(key, value);
  element.append(...children);
  return element;
}

function toScreen(sheet, east, north) {
  const {view, projection} = sheet;
  const [x, y] = projection.forward(east, north);
  return [(x - view.x) * view.scale + view.centreX, (y - view.y) * view.scale + view.centreY];
}

function toEarth(sheet, x, y) {
  const {view, projection} = sheet;
  return projection.inverse(
      (x - view.centreX) / view.scale + view.x, (y - view.centreY) / view.scale + view.y);
}

// A number that is at most so far from a middle.
const within = (number, middle, most) =>
    Math.min(Math.max(number, middle - Math.max(most, 0)), middle + Math.max(most, 0));

// Turns to the picture that is true to shape where one looks, and ends the view where the globe ends.
function keepOnEarth(sheet, plot) {
  if (sheet.isPlane) return;
  const {view, middle} = sheet;
  view.scale = Math.max(view.scale, Math.min(plot.width / 360, plot.height / 180));
  const {pole, aspect} = sheet.projection;
  let [east, north] = sheet.projection.inverse(view.x, view.y);
  if (pole) {
    north = within(north, 0, 90);
  } else {
    east = within(east, middle, 180 - plot.width / 2 / view.scale / aspect);
    north = within(north, 0, 90 - plot.height / 2 / view.scale);
  }
  if (!suits(sheet.projection, [east, north])) sheet.projection = globeView([east, north], middle);
  [view.x, view.y] = sheet.projection.forward(east, north);
}

// The elements of the map, from back to front.
const layers = (() => {
  const map = document.getElementById("map");
  const clip = svgElement("rect", {});
  const inside = svgElement("g", {"clip-path": "url(#plot)"});
  const path = (name) => inside.appendChild(svgElement("path", {class: name}));
  map.append(svgElement("defs", {}, svgElement("clipPath", {id: "plot"}, clip)), inside);
  const made = {
    map, clip,
    paper: map.insertBefore(svgElement("rect", {class: "paper"}), inside),
    graticule: path("graticule"),
    areas: inside.appendChild(svgElement("g", {class: "areas"})),
    silhouettes: path("silhouette"),
    plain: path("cell plain"),
    cells: Array.from({length: kColours}, (_, colour) => path(`cell height${colour}`)),
    outlines: path("outline"),
    problems: path("problem"),
    hovered: path("hovered"),
    selected: path("selected"),
    arrowHalo: path("arrows halo"),
    points: path("points"),
    arrows: path("arrows"),
    texts: inside.appendChild(svgElement("g", {class: "texts"})),
    middle: path("middle"),
    border: map.appendChild(svgElement("rect", {class: "border"})),
    labels: map.appendChild(svgElement("g", {class: "labels"})),
  };
  return made;
})();

// The part of the map inside its margins, in pixels.
function plotOf() {
  const {clientWidth, clientHeight} = layers.map;
  const plot = {
    left: kMargins.left, top: kMargins.top,
    right: Math.max(clientWidth - kMargins.right, kMargins.left + 1),
    bottom: Math.max(clientHeight - kMargins.bottom, kMargins.top + 1)};
  return {...plot, width: plot.right - plot.left, height: plot.bottom - plot.top};
}

const pathOf = (ring) =>
    `M${ring.map(([x, y]) => `${tenth(x)} ${tenth(y)}`).join("L")}Z`;

// A box on the screen: its rings, and what they take up.
function onScreen(sheet, box) {
  const {view} = sheet;
  const rings = ringsOf(sheet.projection, box);
  const bounds = {left: Infinity, right: -Infinity, top: Infinity, bottom: -Infinity};
  for (const ring of rings) {
    for (const point of ring) {
      point[0] = (point[0] - view.x) * view.scale + view.centreX;
      point[1] = (point[1] - view.y) * view.scale + view.centreY;
      bounds.left = Math.min(bounds.left, point[0]);
      bounds.right = Math.max(bounds.right, point[0]);
      bounds.top = Math.min(bounds.top, point[1]);
      bounds.bottom = Math.max(bounds.bottom, point[1]);
    }
  }
  return {rings, ...bounds};
}

const meets = (bounds, plot) => bounds.right >= plot.left && bounds.left <= plot.right &&
    bounds.bottom >= plot.top && bounds.top <= plot.bottom;

// A window as a path; one that is hardly to be seen is a small square.
function windowPath(drawn) {
  const {rings, left, right, top, bottom} = drawn;
  if (right - left >= kSmallest && bottom - top >= kSmallest) return rings.map(pathOf).join("");
  const width = tenth(Math.max(right - left, kSmallest));
  const height = tenth(Math.max(bottom - top, kSmallest));
  return `M${tenth((left + right - width) / 2)} ${tenth((top + bottom - height) / 2)}` +
      `h${width}v${height}h${-width}z`;
}

// Where a point of a window is, with the part of the window that is nearest to it.
function pointOf(window, point) {
  const {northStep, eastStep} = window;
  const latitude = window.top - Math.floor(point / kGridPoints) * northStep;
  const longitude = window.west + point % kGridPoints * eastStep;
  return {
    latitude, longitude,
    south: Math.max(latitude - northStep / 2, window.south),
    north: Math.min(latitude + northStep / 2, window.north),
    west: Math.max(longitude - eastStep / 2, window.west),
    east: Math.min(longitude + eastStep / 2, window.east)};
}

// Keeps texts from lying over one another.
function makeRoom() {
  const taken = [];
  return (box) => {
    const isFree = taken.every((other) => box.right < other.left || box.left > other.right ||
        box.bottom < other.top || box.top > other.bottom);
    if (isFree) taken.push(box);
    return isFree;
  };
}

// Adds a text where there is room for it.
function placeText(texts, hasRoom, text, x, y, anchor, name) {
  const width = text.length * kLetterWidth;
  const left = {start: x, middle: x - width / 2, end: x - width}[anchor];
  const box = {left, right: left + width, top: y - kLabelHeight + 3, bottom: y + 3};
  if (!hasRoom(box)) return;
  const element = svgElement("text", {x: tenth(x), y: tenth(y), "text-anchor": anchor, class: name});
  element.textContent = text;
  texts.append(element);
}

// Returns whether an edge of an area is in view.
function drawAreas(sheet, plot, texts, hasRoom) {
  let hasEdge = false;
  const paths = new Map(sheet.files.map((file) => [file, ""]));
  for (const area of sheet.areas) {
    if (!area.file.isShown) continue;
    const drawn = onScreen(sheet, area);
    if (!meets(drawn, plot)) continue;
    hasEdge ||= drawn.left >= plot.left || drawn.right <= plot.right ||
        drawn.top >= plot.top || drawn.bottom <= plot.bottom;
    paths.set(area.file, paths.get(area.file) + drawn.rings.map(pathOf).join(""));
    const text = `valid for ${countText(area.entries, "entry", "entries")}`;
    const [x, y] = drawn.rings[0][drawn.rings[0].length - 1];  // its north-west corner
    const isLarge = drawn.right - drawn.left > text.length * kLetterWidth + 12;
    const isIn = x >= plot.left && y >= plot.top && y < plot.bottom - kLabelHeight;
    if (isLarge && isIn) placeText(texts, hasRoom, text, x + 6, y + 15, "start", "areaText");
  }
  layers.areas.replaceChildren(...sheet.files.map(
      (file, index) => svgElement("path", {class: `area file${index % kFileColours}`, d: paths.get(file)})));
  return hasEdge;
}

// The vector of residuals in pixels, turned as north is at its place.
function vectorOnScreen(sheet, east, residualNorth, residualEast) {
  const [x, y] = sheet.projection.northward(east);
  const {pixels} = sheet.symbols;
  return [pixels * (residualNorth * x - residualEast * y),
          pixels * (residualNorth * y + residualEast * x)];
}

// Places a number at a point: away from the arrow, but inside the window, so that the numbers of its
// neighbours have their place.
function placeNumber(texts, hasRoom, text, point, [x, y], [arrowX, arrowY]) {
  const [row, column] = [Math.floor(point / kGridPoints), point % kGridPoints];
  const last = kGridPoints - 1;
  const isBelow = row === 0 || (row < last && arrowY <= 0);
  const isRight = column === 0 || (column < last && arrowX <= 0);
  placeText(texts, hasRoom, text, x + (isRight ? 7 : -7), y + (isBelow ? 16 : -7),
            isRight ? "start" : "end", "number");
}

// Draws the points of a near window.
function drawPoints(sheet, window, drawn, paths, texts, hasRoom) {
  const hasNumbers = window.hasHeights && drawn.size >= kNumbersFrom;
  for (let point = 0; point < kPoints; ++point) {
    const place = pointOf(window, point);
    if (!sheet.isPlane && Math.abs(place.latitude) > 90) continue;  // over the pole is nowhere
    const at = toScreen(sheet, place.longitude, place.latitude);
    const height = residualOf(sheet, window, kHeight, point);
    let vector = [0, 0];
    if (window.hasHeights) {
      paths.cells[colourOf(sheet.symbols, height)] +=
          onScreen(sheet, place).rings.map(pathOf).join("");
    }
    if (window.hasVectors) {
      vector = vectorOnScreen(sheet, place.longitude, residualOf(sheet, window, kNorth, point),
                              residualOf(sheet, window, kEast, point));
      paths.points += `M${tenth(at[0])} ${tenth(at[1])}h0`;
      paths.arrows += arrowPath(...at, ...vector);
    }
    if (hasNumbers) placeNumber(texts, hasRoom, numberText(height, 0), point, at, vector);
  }
}

function drawWindows(sheet, plot, texts, hasRoom) {
  const inView = [];
  for (const window of sheet.windows) {
    if (!window.file.isShown) continue;
    const drawn = onScreen(sheet, window);
    if (!meets(drawn, plot)) continue;
    drawn.size = Math.min(drawn.right - drawn.left, drawn.bottom - drawn.top);
    inView.push([window, drawn]);
  }
  const paths = {cells: Array(kColours).fill(""), plain: "", silhouettes: "", outlines: "",
                 problems: "", points: "", arrows: ""};
  const shown = {arrows: new Set(), heights: new Set()};
  for (const [window, drawn] of inView) {
    const path = windowPath(drawn);
    if (drawn.size >= kOutlineFrom) {
      paths.outlines += path;
    } else if (inView.length <= kMostSilhouettes) {
      paths.silhouettes += path;
    }
    if (window.problem) {
      paths.problems += path;
      if (drawn.size >= kOutlineFrom) paths.problems += crossPath(drawn);
      continue;
    }
    const isNear = drawn.size >= kPointsFrom && inView.length <= kMostNear;
    if (isNear) {
      if (!window.hasHeights) paths.plain += path;
      drawPoints(sheet, window, drawn, paths, texts, hasRoom);
      if (window.hasVectors) shown.arrows.add("points");
      if (window.hasHeights) shown.heights.add("points");
      if (window.hasHeights && drawn.size >= kNumbersFrom) shown.heights.add("numbers");
      continue;
    }
    const [north, east, height] = window.middle;
    if (window.hasHeights) {
      paths.cells[colourOf(sheet.symbols, height)] += path;
      shown.heights.add("windows");
    } else {
      paths.plain += path;
    }
    const hasArrow = window.hasVectors && drawn.size >= kArrowFrom && !sheet.withoutMeans;
    if (!hasArrow || inView.length > kMostArrows) continue;
    const longitude = (window.west + window.east) / 2;
    const [x, y] = toScreen(sheet, longitude, (window.south + window.north) / 2);
    paths.points += `M${tenth(x)} ${tenth(y)}h0`;
    paths.arrows += arrowPath(x, y, ...vectorOnScreen(sheet, longitude, north, east));
    shown.arrows.add("windows");
  }
  paths.cells.forEach((path, colour) => layers.cells[colour].setAttribute("d", path));
  layers.arrowHalo.setAttribute("d", paths.arrows);
  for (const name of ["plain", "silhouettes", "outlines", "problems", "points", "arrows"]) {
    layers[name].setAttribute("d", paths[name]);
  }
  return shown;
}

const crossPath = ({left, right, top, bottom}) =>
    `M${tenth(left)} ${tenth(top)}L${tenth(right)} ${tenth(bottom)}` +
    `M${tenth(left)} ${tenth(bottom)}L${tenth(right)} ${tenth(top)}`;

function drawGraticule(sheet, plot) {
  const {path, bottom, left} = graticule(sheet, plot);
  layers.graticule.setAttribute("d", path);
  const texts = bottom.map(({x, text}) => svgElement("text", {
    x: tenth(x), y: plot.bottom + 16, "text-anchor": "middle"}, text));
  for (const {y, text} of left) {
    texts.push(svgElement("text", {
      transform: `translate(${plot.left - 8} ${tenth(y)}) rotate(-90)`, "text-anchor": "middle"},
    text));
  }
  layers.labels.replaceChildren(...texts);
}

// Draws the outlines of what is pointed at and of what is kept.
function drawChosen(sheet) {
  for (const name of ["hovered", "selected"]) {
    const window = sheet[name];
    layers[name].setAttribute("d", window ? windowPath(onScreen(sheet, window)) : "");
  }
}

// Draws everything. Returns what of the legend is on the map: hasAreaEdge; arrows and heights, sets of
// what there are, for "windows" or "points", "numbers" at points.
function draw(sheet) {
  const plot = plotOf();
  const {map, clip, paper, border, middle} = layers;
  map.setAttribute("viewBox", `0 0 ${map.clientWidth} ${map.clientHeight}`);
  for (const rect of [clip, paper, border]) {
    for (const [key, value] of [["x", plot.left], ["y", plot.top], ["width", plot.width],
                                ["height", plot.height]]) rect.setAttribute(key, value);
  }
  const [x, y] = [plot.left + plot.width / 2, plot.top + plot.height / 2];
  sheet.view.centreX = x;
  sheet.view.centreY = y;
  middle.setAttribute("d", `M${x - 9} ${y}h18M${x} ${y - 9}v18`);
  keepOnEarth(sheet, plot);
  const texts = [];
  const hasRoom = makeRoom();
  drawGraticule(sheet, plot);
  const shown = drawWindows(sheet, plot, {append: (text) => texts.push(text)}, hasRoom);
  const hasAreaEdge = drawAreas(sheet, plot, {append: (text) => texts.push(text)}, hasRoom);
  layers.texts.replaceChildren(...texts);
  drawChosen(sheet);
  return {...shown, hasAreaEdge};
}
