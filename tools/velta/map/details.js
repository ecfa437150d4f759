// Details: the numbers of the window that is pointed at, or of the place.

const kMethods = ["bilinear", "biquadratic", "spline"];
const kMostAreas = 6;  // that are named for a place

const methodText = (method) => method < 0 ? "does not apply" : kMethods[method] ?? `${method}`;

// Edges with as many decimals as a message's steps have.
function edgeText(value, isPlane, isNorth) {
  return coordinateText(value, isPlane ? 0.1 : 1e-6, isPlane, isNorth);
}

function edgeTexts(box, isPlane) {
  const text = (value, isNorth) => edgeText(value, isPlane, isNorth);
  const isWhole = (from, to, range) => !isPlane && to - from >= range;
  return [
    isWhole(box.south, box.north, 180) ? "every latitude" :
        `${text(box.south, true)} – ${text(box.north, true)}`,
    isWhole(box.west, box.east, 360) ? "every longitude" :
        `${text(box.west, false)} – ${text(box.east, false)}`];
}

// Terms with their values, each of which is some lines.
function termList(pairs) {
  return element("dl", {}, ...pairs.flatMap(([term, ...lines]) => [
    element("dt", {}, term),
    element("dd", {}, ...lines.map((line) => element("div", {}, line)))]));
}

// 16 numbers as they lie on the map.
function pointTable(caption, values, decimals) {
  const rows = [];
  for (let row = 0; row < kGridPoints; ++row) {
    const cells = values.slice(row * kGridPoints, (row + 1) * kGridPoints)
        .map((value) => element("td", {}, numberText(value, decimals)));
    rows.push(element("tr", {}, ...cells));
  }
  return element("table", {}, element("caption", {}, caption), element("tbody", {}, ...rows));
}

function stepTexts(sheet, window) {
  const {northStep: north, eastStep: east} = window;
  if (sheet.isPlane) return [`north ${numberText(north, 0)} m`, `east ${numberText(east, 0)} m`];
  const metres = kMetresPerArcSecond * kArcSecondsPerDegree;
  const alongParallel = metres * Math.cos(radians((window.south + window.north) / 2));
  const text = (degrees, metresPerDegree) => `${numberText(degrees * kArcSecondsPerDegree, 1)}″ ` +
      `(${numberText(degrees * metresPerDegree, 0)} m)`;
  return [`north ${text(north, metres)}`, `east ${text(east, alongParallel)}`];
}

function meanText(sheet, window, part) {
  const at = window.index * kParts + part;
  const ground = `${numberText(sheet.means[at], 0)} mm`;
  if (part === kHeight || sheet.isPlane) return ground;
  const arcSeconds = sheet.columns.means[at] / sheet.columns.residualUnits;
  return `${numberText(arcSeconds, 5)}″ (${ground})`;
}

function windowDetails(sheet, window) {
  const terms = [
    ["File", window.file.name],
    ["Covers", ...edgeTexts(window, sheet.isPlane)],
    ["Steps", ...stepTexts(sheet, window)],
  ];
  const title = element("h2", {}, `Window ${numberText(window.index + 1, 0)} of ` +
      numberText(sheet.windows.length, 0));
  const entry = element("p", {class: "entry"}, window.entry);
  if (window.problem) {
    return [title, entry, element("p", {class: "warning"}, `Cannot be used: ${window.problem}`),
            termList(terms)];
  }
  terms.push(["Interpolation", `horizontal ${methodText(window.methods[0])}`,
              `height ${methodText(window.methods[1])}`]);
  const means = [];
  if (window.hasVectors) {
    means.push(`north ${meanText(sheet, window, kNorth)}`, `east ${meanText(sheet, window, kEast)}`);
  }
  if (window.hasHeights) means.push(`height ${meanText(sheet, window, kHeight)}`);
  if (means.length > 0) terms.push(["Means", ...means]);
  const tables = [];
  const addTable = (name, part) => {
    const values = Array.from(
        {length: kPoints}, (_, point) => residualOf(sheet, window, part, point));
    const means = sheet.withoutMeans ? "without the mean" : "with the mean";
    tables.push(pointTable(`${name} residual, mm, ${means}`, values, 1));
  };
  if (window.hasVectors) {
    addTable("North", kNorth);
    addTable("East", kEast);
  }
  if (window.hasHeights) addTable("Height", kHeight);
  return [title, entry, termList(terms), ...tables];
}

function placeDetails(sheet, [east, north]) {
  const step = 10 ** Math.floor(Math.log10(2 / sheet.view.scale));
  const place = `${coordinateText(north, step, sheet.isPlane, true)}, ` +
      coordinateText(east, step, sheet.isPlane, false);
  const children = [element("h2", {}, "No window here"), element("p", {class: "place"}, place)];
  if (sheet.isPlane) return children;
  const around = sheet.areas.filter((area) => area.file.isShown && holds(sheet, area, east, north, 0));
  const areaText = (area) => element("li", {}, `${area.file.name}: ${edgeTexts(area, false).join(", ")}; ` +
      countText(area.entries, "entry", "entries") +
      (area.unusable > 0 ? `, of which ${numberText(area.unusable, 0)} cannot be used` : ""));
  const list = around.slice(0, kMostAreas).map(areaText);
  if (around.length > list.length) {
    list.push(element("li", {}, `and ${numberText(around.length - list.length, 0)} more`));
  }
  children.push(element("p", {}, around.length > 0 ? "Areas of validity around it:" :
      "In no area of validity"), element("ul", {}, ...list));
  return children;
}

// Steps from window to window, for who does not point.
function stepButtons(sheet) {
  const button = (text, label, by) => {
    const made = element("button", {"aria-label": label, title: label, id: `step${by}`}, text);
    made.addEventListener("click", () => {
      selectNext(sheet, by);
      document.getElementById(`step${by}`).focus();
    });
    return made;
  };
  return element("div", {class: "buttons"}, button("‹", "Previous window", -1),
                 button("›", "Next window", 1));
}

// What is done with a height residual.
function heightText(sheet) {
  const indicators = sheet.files.flatMap((file) => file.heightIndicators);
  const areAll = (isMeant) => indicators.length > 0 && indicators.every(isMeant);
  if (areAll((indicator) => indicator === 1 || indicator === 2)) {
    return "Heights are physical here: it is how far their zero lies above the ellipsoid, and is taken off.";
  }
  if (areAll((indicator) => indicator === 0)) return "It is added to the ellipsoidal height.";
  return "It is added to an ellipsoidal height; where heights are physical, it is how far their zero lies " +
      "above the ellipsoid, and is taken off.";
}

// What the signs of the map say, for who sees such a map for the first time.
function readingDetails(sheet) {
  const title = element("h2", {}, "How to read this map");
  const paragraph = (...text) => element("p", {}, ...text);
  const term = (text) => element("b", {}, text);
  const areas = paragraph("An ", term("area of validity"), ", dashed, is where an entry of the file may be " +
      "used; entries often share one. Latitudes and longitudes are the source system's.");
  const areaParagraphs = sheet.areas.length > 0 ? [areas] : [];
  if (sheet.windows.length === 0) {
    return [title, ...areaParagraphs, paragraph("There are no grid windows in these files.")];
  }
  return [
    title, ...areaParagraphs,
    paragraph("A ", term("grid window"), " has 4 × 4 points with residuals, from edge to edge. Between " +
        "the points they are interpolated."),
    paragraph("An ", term("arrow"), " points where a position is moved. Its length has a scale of its " +
        "own, in the legend, as the map's distances are much longer."),
    paragraph("A ", term("colour"), ` shows the height residual. ${heightText(sheet)}`),
    paragraph("From afar a window has one arrow and one colour, its mean. Zoom in for those of its points, " +
        "and for numbers."),
    paragraph("Point at a window for all its numbers; ‹ and › go from one to the next."),
  ];
}

// Shows what is pointed at, else what is kept, else how to read the map.
// place: [longitude or easting, latitude or northing] that is pointed at, if any
function showDetails(sheet, place) {
  const window = sheet.hovered ?? (place ? null : sheet.selected);
  const children = window ? windowDetails(sheet, window) :
      place ? placeDetails(sheet, place) : readingDetails(sheet);
  if (sheet.windows.length > 0) {
    children[0] = element("div", {class: "title"}, children[0], stepButtons(sheet));
  }
  document.getElementById("details").replaceChildren(...children);
}
