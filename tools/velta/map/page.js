// The page: its sheets, the tabs that choose one, and when the map is drawn.

const kMostNames = 4;  // of files in the heading

const data = JSON.parse(document.getElementById("data").textContent);
const tabs = ["datums", "projections"].filter((kind) => data[kind].files.length > 0);
const sheets = {};
let kindShown = tabs[0];
const current = () => sheets[kindShown];

let isDrawRequested = false;
function requestDraw() {
  if (isDrawRequested) return;
  isDrawRequested = true;
  requestAnimationFrame(() => {
    isDrawRequested = false;
    updateLegend(draw(current()));
  });
}

// Paper has a width of its own: the same part of the earth is drawn for it.
function drawForPrint() {
  const sheet = current();
  const before = plotOf();
  const {scale} = sheet.view;
  const {classList} = document.getElementById("frame");
  const resize = (isPrinted) => {
    classList.toggle("printed", isPrinted);
    const {width, height} = plotOf();
    sheet.view.scale = isPrinted ? scale * Math.min(width / before.width, height / before.height) : scale;
    updateLegend(draw(sheet));
  };
  resize(true);
  addEventListener("afterprint", () => resize(false), {once: true});
}

function summaryOf(sheet) {
  const windows = countText(sheet.windows.length, "grid window", "grid windows");
  const [first] = sheet.files;
  const systems = sheet.files.length === 1 && first.systems ? ` ${first.systems}` : "";
  if (sheet.windows.length === 0) {
    return sheet.isPlane ? "Map projections without residuals: there is nothing to draw." :
        `Where the datum transformation${systems} is valid. There are no residuals.`;
  }
  if (sheet.isPlane) {
    return `Residuals at the points of ${windows}: what is left to correct in northing, easting and height ` +
        "after the map projection.";
  }
  return `Residuals at the points of ${windows}: what is left to correct in latitude, longitude and height ` +
      `after the datum transformation${systems}.`;
}

// Shows a kind of files. Its sheet is made when it is first shown.
function show(kind) {
  kindShown = kind;
  sheets[kind] ??= makeSheet(data[kind], kind === "projections");
  for (const tab of tabs) {
    const button = document.getElementById(tab);
    button.setAttribute("aria-selected", tab === kind);
    button.tabIndex = tab === kind ? 0 : -1;
  }
  document.getElementById("summary").textContent = summaryOf(current());
  document.getElementById("windows").disabled = current().windows.length === 0;
  showLegend(current());
  if (!current().view) {  // now that the map has its size beside the legend
    fit(current(), current().windows.length > 0 ? current().windows : everything(current()));
  }
  showDetails(current());
  requestDraw();
}

function start() {
  const files = tabs.flatMap((kind) => data[kind].files);
  const more = files.length - kMostNames;
  const names = files.slice(0, kMostNames).join(", ") + (more > 0 ? ` and ${more} more` : "");
  document.title = `${names} – residual grids`;
  document.getElementById("heading").textContent = `Residual grids of ${names}`;
  document.getElementById("tabs").hidden = tabs.length < 2;
  const {map} = layers;
  for (const tab of tabs) {
    const button = document.getElementById(tab);
    button.addEventListener("click", () => show(tab));
    button.addEventListener("keydown", (event) => {
      if (event.key !== "ArrowLeft" && event.key !== "ArrowRight") return;
      const other = tabs.find((kind) => kind !== kindShown);
      if (!other) return;
      show(other);
      document.getElementById(other).focus();
    });
  }
  const zoomMiddle = (factor) => {
    const {view} = current();
    zoom(current(), factor, view.centreX, view.centreY);
  };
  const buttons = {
    everything: () => fit(current(), everything(current())),
    windows: () => fit(current(), current().windows),
    in: () => zoomMiddle(kZoomStep),
    out: () => zoomMiddle(1 / kZoomStep),
  };
  for (const [id, act] of Object.entries(buttons)) {
    document.getElementById(id).addEventListener("click", act);
  }
  show(kindShown);
  followUser(map, current);
  new ResizeObserver(requestDraw).observe(map);
  addEventListener("beforeprint", drawForPrint);
}

start();
