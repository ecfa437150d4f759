// Moving: the view of a sheet, and how wheel, fingers and keys change it.

const kZoomStep = 1.5;
const kWheelZoom = 0.0015;     // per pixel that the wheel scrolls
const kPanStep = 80;           // pixels
const kFitMargin = 0.08;       // of the map around what is fitted into it
const kClickMoves = 4;         // pixels that a click may move
const kPointingRoom = 4;       // pixels around a window that is too small to be hit
const kLargestWindow = 2500;   // pixels, at the nearest

// Whether a box holds a place.
// room: around the box, in units of the picture
function holds(sheet, box, east, north, room) {
  const turns = sheet.isPlane ? 0 : 360 * Math.round(((box.west + box.east) / 2 - east) / 360);
  const eastRoom = room / sheet.projection.unitWidth(north);
  return north >= box.south - room && north <= box.north + room &&
      east + turns >= box.west - eastRoom && east + turns <= box.east + eastRoom;
}

// The window that a place is in; of several the one whose middle is nearest.
function windowAt(sheet, [east, north]) {
  const room = kPointingRoom / sheet.view.scale;
  let nearest = null;
  let least = Infinity;
  for (const window of sheet.windows) {
    if (!window.file.isShown || !holds(sheet, window, east, north, room)) continue;
    const distance = Math.hypot((window.south + window.north) / 2 - north,
                                (window.west + window.east) / 2 - east);
    if (distance < least) [nearest, least] = [window, distance];
  }
  return nearest;
}

// What boxes take up in the picture.
function pictureOf(sheet, boxes) {
  const rings = boxes.flatMap((box) => ringsOf(sheet.projection, box));
  return hull(rings.flat().map(([x, y]) => ({south: y, north: y, west: x, east: x})));
}

function fit(sheet, boxes) {
  const plot = plotOf();
  sheet.projection = viewOf(sheet, boxes);
  const {south, north, west, east} = pictureOf(sheet, boxes);
  const size = Math.max(north - south, east - west) || 1;
  const scale = (1 - 2 * kFitMargin) * Math.min(
      plot.width / Math.max(east - west, size / 1000),
      plot.height / Math.max(north - south, size / 1000));
  sheet.view = {...sheet.view, x: (west + east) / 2, y: (south + north) / 2, scale};
  requestDraw();
}

function limitsOf(sheet) {
  const {south, north, west, east} = pictureOf(sheet, everything(sheet));
  const smallest = Math.min(...sheet.windows.map((window) => window.north - window.south)
      .filter((extent) => extent > 0), Math.max(north - south, east - west, 1e-3) / 10);
  return {least: 100 / Math.max(north - south, east - west, smallest), most: kLargestWindow / smallest};
}

const everything = (sheet) => {
  const all = [...sheet.areas, ...sheet.windows];
  return all.length > 0 ? all : [{south: -60, north: 60, west: -90, east: 90}];
};

// Zooms so that what is at a place of the screen stays there.
function zoom(sheet, factor, x, y) {
  const {view, limits} = sheet;
  const scale = Math.min(Math.max(view.scale * factor, limits.least), limits.most);
  view.x += (x - view.centreX) * (1 / view.scale - 1 / scale);
  view.y += (y - view.centreY) * (1 / view.scale - 1 / scale);
  view.scale = scale;
  requestDraw();
}

function pan(sheet, dx, dy) {
  sheet.view.x -= dx / sheet.view.scale;
  sheet.view.y -= dy / sheet.view.scale;
  requestDraw();
}

function select(sheet, window) {
  sheet.selected = window;
  showDetails(sheet);
  requestDraw();
}

// Goes on to another window, and brings it into view.
function selectNext(sheet, by) {
  const shown = sheet.windows.filter((window) => window.file.isShown);
  if (shown.length === 0) return;
  const from = sheet.selected ? shown.indexOf(sheet.selected) : by > 0 ? -1 : 0;
  const window = shown[(from + by + shown.length) % shown.length];
  const {left, right, top, bottom} = onScreen(sheet, window);
  const plot = plotOf();
  if (left < plot.left || right > plot.right || top < plot.top || bottom > plot.bottom) {
    pan(sheet, sheet.view.centreX - (left + right) / 2, sheet.view.centreY - (top + bottom) / 2);
  }
  sheet.hovered = null;
  select(sheet, window);
}

// Selects the window that is nearest to the middle of the map.
function selectMiddle(sheet) {
  const [x, y] = [sheet.view.centreX, sheet.view.centreY];
  let nearest = null;
  let least = Infinity;
  for (const window of sheet.windows) {
    if (!window.file.isShown) continue;
    const {left, right, top, bottom} = onScreen(sheet, window);
    const distance = Math.hypot((left + right) / 2 - x, (top + bottom) / 2 - y);
    if (distance < least) [nearest, least] = [window, distance];
  }
  if (nearest) select(sheet, nearest);
}

// Has the map follow pointers, wheel and keys.
// current: gives the sheet that is shown
function followUser(map, current) {
  const pointers = new Map();
  let moved = 0;
  const placeOf = (event) => {
    const {left, top} = map.getBoundingClientRect();
    return {x: event.clientX - left, y: event.clientY - top};
  };
  const middleOfPointers = () => {
    const all = [...pointers.values()];
    const x = all.reduce((sum, pointer) => sum + pointer.x, 0) / all.length;
    const y = all.reduce((sum, pointer) => sum + pointer.y, 0) / all.length;
    return {x, y, spread: all.length > 1 ? Math.hypot(all[0].x - all[1].x, all[0].y - all[1].y) : 0};
  };
  const point = (event) => {
    const sheet = current();
    const {x, y} = placeOf(event);
    const place = toEarth(sheet, x, y);
    if (!sheet.projection.has(...place)) {
      pointAtNothing();
      return;
    }
    sheet.hovered = windowAt(sheet, place);
    showDetails(sheet, place);
    drawChosen(sheet);
  };
  const pointAtNothing = () => {
    current().hovered = null;
    showDetails(current());
    drawChosen(current());
  };
  map.addEventListener("pointerdown", (event) => {
    map.setPointerCapture(event.pointerId);
    pointers.set(event.pointerId, placeOf(event));
    if (pointers.size === 1) moved = 0;
  });
  map.addEventListener("pointermove", (event) => {
    if (!pointers.has(event.pointerId)) {
      point(event);
      return;
    }
    const before = middleOfPointers();
    pointers.set(event.pointerId, placeOf(event));
    const after = middleOfPointers();
    moved += Math.hypot(after.x - before.x, after.y - before.y);
    if (pointers.size > 1) moved = Infinity;
    if (moved < kClickMoves) return;
    pan(current(), after.x - before.x, after.y - before.y);
    if (before.spread > 0) zoom(current(), after.spread / before.spread, after.x, after.y);
  });
  const release = (event) => {
    if (!pointers.delete(event.pointerId) || event.type !== "pointerup") return;
    if (moved >= kClickMoves) return;
    const sheet = current();
    const {x, y} = placeOf(event);
    const place = toEarth(sheet, x, y);
    select(sheet, sheet.projection.has(...place) ? windowAt(sheet, place) : null);
    if (event.pointerType === "mouse") point(event);
  };
  map.addEventListener("pointerup", release);
  map.addEventListener("pointercancel", release);
  map.addEventListener("pointerleave", pointAtNothing);
  map.addEventListener("wheel", (event) => {
    event.preventDefault();
    const {x, y} = placeOf(event);
    const lines = event.deltaMode === WheelEvent.DOM_DELTA_LINE ? 20 : 1;
    zoom(current(), Math.exp(-event.deltaY * lines * kWheelZoom), x, y);
  }, {passive: false});

  const keys = {
    ArrowLeft: (sheet) => pan(sheet, kPanStep, 0),
    ArrowRight: (sheet) => pan(sheet, -kPanStep, 0),
    ArrowUp: (sheet) => pan(sheet, 0, kPanStep),
    ArrowDown: (sheet) => pan(sheet, 0, -kPanStep),
    "+": (sheet) => zoom(sheet, kZoomStep, sheet.view.centreX, sheet.view.centreY),
    "-": (sheet) => zoom(sheet, 1 / kZoomStep, sheet.view.centreX, sheet.view.centreY),
    0: (sheet) => fit(sheet, everything(sheet)),
    Enter: selectMiddle,
    Escape: (sheet) => select(sheet, null),
  };
  keys["="] = keys["+"];  // on many keyboards the same key
  map.addEventListener("keydown", (event) => {
    if (event.ctrlKey || event.metaKey || event.altKey || !keys[event.key]) return;
    event.preventDefault();
    keys[event.key](current());
  });
}
