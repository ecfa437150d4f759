// Symbols: colours and arrows that stand for residuals, and the numbers of their legend.

const kColours = 9;             // of heights; the middle one is for the mean
const kTypicalArrow = 26;       // pixels
const kLegendArrow = 60;        // pixels, at most
const kTypicalShare = 0.75;     // of the arrows are no longer than a typical one
const kColouredShare = 0.98;    // of the heights are within the scale of colours

const tenth = (number) => Math.round(number * 10) / 10;

// The nearest number of 1, 2, 5, 10, 20, 50, ... that is not below, or not above.
function roundUp(number) {
  const power = 10 ** Math.floor(Math.log10(number));
  return [1, 2, 5, 10].map((digit) => digit * power).find((step) => step >= number * (1 - 1e-9));
}

function roundDown(number) {
  const power = 10 ** Math.floor(Math.log10(number) + 1e-9);
  return [5, 2, 1].map((digit) => digit * power).find((step) => step <= number * (1 + 1e-9));
}

// A number with groups of three digits and a minus sign, as a text is set.
function numberText(number, decimals) {
  const [whole, fraction] = Math.abs(number).toFixed(decimals).split(".");
  const isZero = !/[1-9]/.test(whole + (fraction ?? ""));
  const grouped = whole.replace(/\B(?=(\d{3})+$)/g, "\u202f");
  return (number < 0 && !isZero ? "−" : "") + grouped + (fraction ? `.${fraction}` : "");
}

// A round length in millimetres.
function lengthText(length) {
  if (length >= kMillimetresPerMetre) return `${numberText(length / kMillimetresPerMetre, 0)}\u00a0m`;
  return `${numberText(length, Math.max(0, -Math.floor(Math.log10(length) + 1e-9)))}\u00a0mm`;
}

// The value that a share of them does not exceed.
function quantile(values, share) {
  if (values.length === 0) return 0;
  const sorted = Float64Array.from(values).sort();
  return sorted[Math.min(sorted.length - 1, Math.floor(share * sorted.length))];
}

// Finds the scales of arrows and colours that suit all residuals of a sheet as they are shown.
function measure(sheet) {
  const lengths = [];
  const heights = [];
  for (const window of sheet.windows) {
    for (let point = 0; point < kPoints; ++point) {
      if (window.hasVectors) {
        lengths.push(Math.hypot(residualOf(sheet, window, kNorth, point),
                                residualOf(sheet, window, kEast, point)));
      }
      if (window.hasHeights) heights.push(residualOf(sheet, window, kHeight, point));
    }
    window.middle = [kNorth, kEast, kHeight].map((part) => middleOf(sheet, window, part));
  }
  const typical = quantile(lengths, kTypicalShare) || 1;
  const pixels = kTypicalArrow / typical;  // per millimetre
  const arrow = roundDown(kLegendArrow / pixels);
  const mean = sheet.withoutMeans ? 0 : heights.reduce((sum, h) => sum + h, 0) / heights.length;
  const spread = quantile(heights.map((height) => Math.abs(height - mean)), kColouredShare);
  const colourStep = roundUp(spread / ((kColours - 1) / 2) || 1);
  sheet.symbols = {pixels, arrow, mean, colourStep};
}

// The colour of a height: 0 is the lowest.
function colourOf(symbols, height) {
  const end = (kColours - 1) / 2;
  const steps = Math.round((height - symbols.mean) / symbols.colourStep);
  return Math.max(-end, Math.min(end, steps)) + end;
}

// The path of an arrow from a place over so many pixels.
function arrowPath(x, y, dx, dy) {
  const length = Math.hypot(dx, dy);
  if (length < 1) return "";
  const head = Math.min(6, 0.45 * length) / length;
  const [tipX, tipY] = [x + dx, y + dy];
  const barb = (side) => `${tenth(tipX - head * (dx + side * 0.45 * dy))} ` +
      `${tenth(tipY - head * (dy - side * 0.45 * dx))}`;
  return `M${tenth(x)} ${tenth(y)}L${tenth(tipX)} ${tenth(tipY)}` +
      `M${barb(1)}L${tenth(tipX)} ${tenth(tipY)}L${barb(-1)}`;
}
