// The legend: what the signs of the map mean, with their scales.

const kFileColours = 6;  // of the outlines of areas

function countText(count, one, many) {
  return `${numberText(count, 0)} ${count === 1 ? one : many}`;
}

// Makes an element of the page. Whatever a text holds, it is shown as it is.
function element(name, attributes, ...children) {
  const made = document.createElement(name);
  for (const [key, value] of Object.entries(attributes)) made.setAttribute(key, value);
  made.append(...children);
  return made;
}

const swatch = (...children) =>
    svgElement("svg", {class: "swatch", width: 76, height: 22, "aria-hidden": "true"}, ...children);

function legendRow(sign, ...text) {
  return element("div", {class: "row"}, sign, element("span", {}, ...text));
}

function fileRow(sheet, file, areas, windows) {
  const name = sheet.isPlane ? "outline" : `area file${sheet.files.indexOf(file) % kFileColours}`;
  const line = swatch(svgElement("rect", {class: name, x: 14, y: 3, width: 48, height: 16}));
  const entries = areas.reduce((sum, area) => sum + area.entries, 0);
  const areaText = sheet.isPlane ? "" : areas.length === 0 ? "no area of validity, " :
      `${countText(areas.length, "area of validity", "areas of validity")} of ` +
      `${countText(entries, "entry", "entries")}, `;
  const text = areaText + countText(windows.length, "window", "windows");
  if (sheet.files.length === 1) return legendRow(line, text);
  const check = element("input", {type: "checkbox"});
  check.checked = file.isShown;
  check.addEventListener("change", () => {
    file.isShown = check.checked;
    if (sheet.selected?.file === file) sheet.selected = null;
    sheet.hovered = null;
    showDetails(sheet);
    requestDraw();
  });
  const systems = file.systems ? ` ${file.systems},` : "";
  return legendRow(line, element("label", {}, check, element("b", {}, file.name), `${systems} ${text}`));
}

// A remark on what is in view. It keeps its room, as the map would else change its size while it is
// zoomed.
const hintOf = (name) => element("span", {id: `${name}Hint`, class: "aside"});

function arrowRow({arrow, pixels}) {
  const length = arrow * pixels;
  const start = 38 - length / 2;
  const sign = swatch(
      svgElement("path", {class: "arrows", d: arrowPath(start, 11, length, 0)}),
      svgElement("path", {class: "points", d: `M${start} 11h0`}));
  return legendRow(sign, element("b", {}, "Arrow: horizontal residual"), ", this one: ",
                   element("b", {id: "arrowLength"}, lengthText(arrow)), hintOf("arrow"));
}

function colourScale(sheet) {
  const {mean, colourStep} = sheet.symbols;
  const end = (kColours - 1) / 2;
  const isLarge = end * colourStep >= 100;
  const unit = isLarge ? "m" : "mm";
  const perUnit = isLarge ? kMillimetresPerMetre : 1;
  const decimals = Math.max(0, -Math.floor(Math.log10(colourStep / perUnit) + 1e-9));
  const width = 30;
  const side = 16;  // so that the texts at the ends have room
  const scale = svgElement("svg", {
    class: "scale", viewBox: `${-side} 0 ${kColours * width + 2 * side} 36`, role: "img",
    "aria-label": "Scale of colours of height residuals"});
  for (let colour = 0; colour < kColours; ++colour) {
    const x = colour * width;
    scale.append(svgElement(
        "rect", {class: `cell height${colour}`, x, y: 0, width, height: 16}));
    if (colour % 2) continue;
    const sign = {0: "≤", [kColours - 1]: "≥"}[colour] ?? "";
    const value = (colour - end) * colourStep / perUnit;
    scale.append(svgElement(
        "text", {x: x + width / 2, y: 31, "text-anchor": "middle"},
        sign + (value > 0 ? "+" : "") + numberText(value, decimals)));
  }
  const from = sheet.withoutMeans ? "deviation from the mean of its window" :
      `deviation from ${numberText(mean / kMillimetresPerMetre, 3)} m, the mean of all windows`;
  return element("div", {class: "colours"},
                 element("p", {}, element("b", {}, "Colour: height residual"), `, ${from}, in ${unit}`),
                 scale, hintOf("height"));
}

// Whether residuals are shown whole or as deviations: the means are often so much larger that
// they hide what happens inside a window.
function meansChoice(sheet) {
  const choice = (text, withoutMeans) => {
    const radio = element("input", {type: "radio", name: "means"});
    radio.checked = sheet.withoutMeans === withoutMeans;
    radio.addEventListener("change", () => {
      sheet.withoutMeans = withoutMeans;
      measure(sheet);
      showLegend(sheet);
      showDetails(sheet);
      requestDraw();
      document.querySelector("input[name=means]:checked").focus();
    });
    return element("label", {}, radio, text);
  };
  return element("div", {role: "radiogroup", "aria-label": "Residuals"}, element("b", {}, "Residuals"),
                 choice("whole", false), choice("without the mean of their window", true));
}

function showLegend(sheet) {
  const rows = [];
  for (const file of sheet.files) {
    rows.push(fileRow(sheet, file, sheet.areas.filter((area) => area.file === file),
                      sheet.windows.filter((window) => window.file === file)));
  }
  const has = (property) => sheet.windows.some((window) => window[property]);
  const cell = (name) => swatch(svgElement("rect", {class: name, x: 26, y: 2, width: 24, height: 18}));
  if (sheet.windows.length > 0) rows.push(legendRow(cell("outline"), "grid window, 4 × 4 points"));
  if (has("hasVectors")) rows.push(arrowRow(sheet.symbols));
  if (sheet.windows.some((window) => !window.problem && !window.hasHeights)) {
    rows.push(legendRow(cell("cell plain outline"), "window without heights"));
  }
  if (has("problem")) {
    const sign = cell("problem");
    sign.append(svgElement("path", {class: "problem", d: "M26 2L50 20M26 20L50 2"}));
    const count = sheet.windows.filter((window) => window.problem).length;
    rows.push(legendRow(sign, `${countText(count, "window", "windows")} that cannot be used`));
  }
  const colours = has("hasHeights") ? [colourScale(sheet)] : [];
  document.getElementById("legend").replaceChildren(
      element("div", {}, ...rows, ...(sheet.areas.length > 0 ? [hintOf("area")] : [])), ...colours);
  const hasResiduals = has("hasHeights") || has("hasVectors");
  document.getElementById("means").replaceChildren(...(hasResiduals ? [meansChoice(sheet)] : []));
}

// Says what of the legend is on the map now, and of what: see draw().
function updateLegend({hasAreaEdge, arrows, heights}) {
  const say = (name, text) => {
    const hint = document.getElementById(`${name}Hint`);
    if (hint) hint.textContent = text;
  };
  say("area", hasAreaEdge ? "" : "No edge of an area of validity is in this view.");
  const ofWhat = (shown) => !shown.has("points") ? "here the mean of a window" :
      !shown.has("windows") ? "here that of each point" :
      "here that of each point, of small windows the mean";
  say("arrow", arrows.size === 0 ? "zoom in to see it" : ofWhat(arrows));
  say("height", heights.size === 0 ? "" :
      ofWhat(heights) + (heights.has("numbers") ? "; its number in mm" : ""));
}
