// Draws the plots of a page with dygraphs: parts of curves, with as many points as the window shows, marks,
// levels and images, and a common time axis for all plots of a link.
"use strict";

const colour = name => getComputedStyle(document.documentElement).getPropertyValue("--" + name).trim();

function numbers(stored) {
  const bytes = Uint8Array.from(atob(stored.data), c => c.charCodeAt(0));
  const small = new Float32Array(bytes.buffer);
  return Float64Array.from(small, value => stored.middle + stored.scale * value);
}

// The lowest and highest values of the samples from `first` to `last`, in at most `most` groups.
function reduce(curves, place, first, last, most) {
  const rows = [], group = Math.max(1, Math.ceil((last - first) / most));
  const bands = curves.some(curve => curve.highs);
  if (group === 1 && !bands) {
    for (let i = first; i < last; i++) rows.push([place(i), ...curves.map(curve => curve.lows[i])]);
    return rows;
  }
  for (let i = first; i < last; i += group) {
    const end = Math.min(i + group, last), low = [place(i)], high = [place(i + (end - i) / 2)];
    for (const curve of curves) {
      let least = NaN, most = NaN;
      for (let k = i; k < end; k++) {
        const a = curve.lows[k], b = curve.highs ? curve.highs[k] : a;
        if (!(least <= a)) least = isNaN(a) ? least : a;
        if (!(most >= b)) most = isNaN(b) ? most : b;
      }
      low.push(least);
      high.push(most);
    }
    rows.push(low, high);
  }
  return rows;
}

// The index of the first of ascending numbers that is at least `least`.
function firstFrom(rising, least) {
  let low = 0, high = rising.length;
  while (low < high) {
    const middle = (low + high) >> 1;
    if (rising[middle] < least) low = middle + 1;
    else high = middle;
  }
  return low;
}

// The samples of a plot that are in the page. A source has the range of its x axis, and `rows`, which passes
// the rows of a part, in at most `most` groups, to the function `then`, immediately or later.
class Inside {
  constructor(plot) {
    this.curves = plot.curves.map(curve => ({lows: numbers(curve), highs: curve.highs && numbers(curve.highs)}));
    this.count = this.curves.length ? this.curves[0].lows.length : 0;
    const x = plot.x;
    this.place = x ? i => i < x.length - 1 ? x[Math.floor(i)] : x[x.length - 1] : i => plot.start + i * plot.step;
    this.index = x ? at => firstFrom(x, at) : at => (at - plot.start) / plot.step;
    this.range = plot.image ? [plot.image.left, plot.image.right] : [this.place(0), this.place(this.count - 1)];
    if (this.range[0] === this.range[1]) this.range = [this.range[0] - 0.5, this.range[0] + 0.5];
  }
  rows([from, to], most, then) {
    const first = Math.max(0, Math.floor(this.index(from)) - 1);
    const last = Math.min(this.count, Math.ceil(this.index(to)) + 2);
    then(reduce(this.curves, this.place, first, last, most));
  }
}

const figures = [];

// A plot in its element: caption, buttons, legend, axes and a dygraphs graph. `window` is the part of the x
// axis that is shown. `asked` is the latest request to the source; answers to earlier ones are dropped. `busy`
// says that the graph is being changed by this script, not by the reader.

class Figure {
  constructor(element, plot, source) {
    Object.assign(this, {element, plot, source, log: false, busy: false});
    const make = (tag, name, parent, text) => {
      const one = document.createElement(tag);
      one.className = name;
      if (text) one.textContent = text;
      return parent.appendChild(one);
    };
    element.textContent = "";
    const caption = make("figcaption", "", element);
    make("strong", "", caption, plot.title);
    const tools = make("span", "tools", caption);
    for (const [text, title, act] of [["+", "zoom in", () => this.zoom(0.5)], ["−", "zoom out", () => this.zoom(2)],
      ["‹", "earlier", () => this.shift(-0.5)], ["›", "later", () => this.shift(0.5)],
      ["all", "show all (or double-click)", () => this.show(this.source.range)]]) {
      const button = make("button", "", tools, text);
      button.type = "button";
      button.title = title;
      button.setAttribute("aria-label", title);
      button.addEventListener("click", act);
    }
    if (plot.may_be_log) {
      const label = make("label", "", tools, " log axis ");
      const box = label.appendChild(document.createElement("input"));
      box.type = "checkbox";
      box.addEventListener("change", () => { this.log = box.checked; this.draw(this.window); });
    }
    this.legend = make("div", "legend", element);
    make("div", "y-label", element, plot.y_label);
    this.canvas = make("div", "canvas", element);
    make("div", "x-label", element, plot.x_label);
    if (plot.image) {
      this.image = new Image();
      this.image.onload = () => this.draw(this.window);
      this.image.src = plot.image.values;
    }
    this.window = plot.x_range || source.range;
    this.draw(this.window);
  }

  show(range, linked = true) {
    const [from, to] = this.source.range, span = Math.min(range[1] - range[0], to - from);
    const first = Math.max(from, Math.min(range[0], to - span));
    this.window = [first, first + span];
    this.refresh();
    if (linked && this.plot.link) {
      for (const other of figures) {
        if (other !== this && other.plot.link === this.plot.link) other.show(this.window, false);
      }
    }
  }

  zoom(factor) {
    const [from, to] = this.window, middle = (from + to) / 2, half = factor * (to - from) / 2;
    this.show([middle - half, middle + half]);
  }

  shift(part) {
    const by = part * (this.window[1] - this.window[0]);
    this.show([this.window[0] + by, this.window[1] + by]);
  }

  points() {
    return Math.max(200, this.canvas.clientWidth || 600);
  }

  // Fetches samples for the window, with a margin on either side for when it is moved.
  refresh() {
    if (!this.graph) return;
    const [from, to] = this.window, margin = (to - from) / 2;
    const asked = this.asked = {};
    this.source.rows([from - margin, to + margin], 2 * this.points(), rows => {
      if (asked !== this.asked) return;
      this.busy = true;
      this.graph.updateOptions({file: this.filled(rows), dateWindow: this.window});
      this.busy = false;
    });
  }

  filled(rows) {
    return rows.length ? rows : [[this.source.range[0], NaN], [this.source.range[1], NaN]];
  }

  draw(window) {
    const plot = this.plot, names = plot.curves.length ? plot.curves.map((curve, i) => curve.name || "y" + i) : ["y"];
    const unique = names.map((name, i) => names.indexOf(name) < i ? name + " " + (i + 1) : name);
    if (this.graph) this.graph.destroy();
    const series = {}, text = value => short(value);
    plot.curves.forEach((curve, i) => {
      series[unique[i]] = {strokeWidth: curve.dots ? 0 : 1, drawPoints: curve.dots, pointSize: 1.5};
    });
    const from = this.log ? Math.max(window[0], this.source.place ? this.source.place(1) : 1e-9) : window[0];
    this.window = [from, window[1]];
    const asked = this.asked = {};
    this.source.rows(this.window, 2 * this.points(), rows => {
      if (asked !== this.asked) return;
      this.busy = true;
      if (this.log) rows = rows.filter(row => row[0] > 0);
      this.graph = new Dygraph(this.canvas, this.filled(rows), {
        labels: [plot.x_label.replace(/ \(.*/, "") || "x", ...unique], series, dateWindow: this.window,
        colors: plot.curves.length ? plot.curves.map(curve => colour(curve.colour)) : [colour("blue")],
        labelsDiv: this.legend, legend: "always", drawGrid: !plot.image, valueRange: plot.y_range, axisLineColor: colour("grey"),
        gridLineColor: colour("grid"), gridLineWidth: 0.8, axisLabelWidth: 64, connectSeparatedPoints: false, digitsAfterDecimal: 6,
        sigFigs: 6, xRangePad: 0, yRangePad: plot.y_range ? 0 : 6, highlightCircleSize: 3,
        axes: {x: {logscale: this.log, axisLabelFormatter: text, valueFormatter: text, pixelsPerLabel: 70},
               y: {axisLabelFormatter: text, valueFormatter: text, pixelsPerLabel: 28, axisLabelWidth: 62}},
        legendFormatter: found => this.legendText(found),
        underlayCallback: (canvas, area, graph) => this.under(canvas, area, graph),
        ...(plot.bars ? {plotter: bars} : {}),
        drawCallback: (graph, isFirst) => this.moved(graph, isFirst),
        interactionModel: {...Dygraph.defaultInteractionModel, dblclick: () => this.show(this.source.range)},
        plugins: [{activate: () => ({didDrawChart: event => this.over(event)})}],
      });
      this.busy = false;
    });
  }

  // The legend as HTML: the curves with the values under the pointer, levels and verticals.
  legendText(found) {
    const safe = text => String(text).replace(/[&<>"']/g, c => `&#${c.charCodeAt(0)};`);
    const parts = found.series.filter(one => this.plot.curves.length).map(one =>
      `<span style="color:${one.color}">&#9632;</span> ${safe(one.label)}` +
      (found.x !== undefined && one.y !== undefined && !isNaN(one.y) ? ` <b>${safe(short(one.y))}</b>` : ""));
    for (const [y, label] of this.plot.levels) if (label) parts.push(`- - ${safe(label)} ${safe(short(y, 5))}`);
    for (const [, label] of this.plot.verticals) parts.push(`| ${safe(label)}`);
    if (found.x !== undefined) parts.push("at " + safe(short(found.x)));
    return parts.join(" &nbsp; ");
  }

  moved(graph, isFirst) {
    if (isFirst || this.busy || !this.graph) return;
    const seen = graph.xAxisRange();
    if (seen[0] !== this.window[0] || seen[1] !== this.window[1]) this.show(seen);
  }

  under(canvas, area, graph) {
    if (this.image && this.image.complete) {
      const shown = this.plot.image, [left, right] = graph.xAxisRange(), [bottom, top] = graph.yAxisRange();
      const wide = this.image.width / (shown.right - shown.left), high = this.image.height / (shown.top - shown.bottom);
      canvas.imageSmoothingEnabled = false;
      canvas.drawImage(this.image, (left - shown.left) * wide, (shown.top - top) * high, (right - left) * wide,
        (top - bottom) * high, area.x, area.y, area.w, area.h);
    }
  }

  over(event) {
    const graph = event.dygraph, canvas = event.drawingContext, area = graph.getArea();
    canvas.save();
    canvas.beginPath();
    canvas.rect(area.x, area.y, area.w, area.h);
    canvas.clip();
    canvas.font = "11px sans-serif";
    canvas.textAlign = "center";
    for (const [y] of this.plot.levels) line(canvas, area.x, graph.toDomYCoord(y), area.x + area.w, null, "grey");
    for (const [x] of this.plot.verticals) line(canvas, graph.toDomXCoord(x), area.y, null, area.y + area.h, "warm");
    const taken = [];  // boxes of marks and labels
    const marks = this.plot.marks.map(mark => [mark, ...graph.toDomCoords(mark.x, mark.y)])
      .filter(([, x]) => x >= area.x - 9 && x <= area.x + area.w + 9);
    for (const [mark, x, y] of marks) {
      canvas.strokeStyle = colour(mark.colour);
      canvas.lineWidth = 1.6;
      canvas.beginPath();
      canvas.arc(x, y, 3.5, 0, 7);
      canvas.stroke();
      taken.push([x - 4, y - 4, 8, 8]);
    }
    canvas.strokeStyle = colour("grey");
    for (const [mark, x, y] of marks) if (mark.label) label(canvas, area, taken, mark.label, x, y);
    canvas.restore();
  }
}

// The place of a label of the given size for a mark at x, y, which is entered in `taken`: above, below, left or right
// of the mark if it is free of other marks and labels, or else in a free row beside it, `isAside`. Undefined if there
// is none.
function placeOf(area, taken, wide, high, x, y) {
  const held = (value, from, size, room) => Math.max(from, Math.min(value, from + size - room));
  const near = [[x - wide / 2, y - 18], [x - wide / 2, y + 6], [x - wide - 5, y - high / 2], [x + 5, y - high / 2]]
    .map(([left, top]) => ({left: held(left, area.x, area.w, wide), top: held(top, area.y, area.h, high)}));
  const aside = [0, 1, 2, 3, 4, 5, 6, -1, -2, -3].flatMap(row => [x + 24, x - 24 - wide].map(left =>
    ({left, top: y - high / 2 + row * high, isAside: true})));
  const place = [...near, ...aside].find(({left, top}) =>
    left >= area.x && left + wide <= area.x + area.w && top >= area.y && top + high <= area.y + area.h &&
    !taken.some(([a, b, w, h]) => left < a + w && a < left + wide && top < b + h && b < top + high));
  if (place) taken.push([place.left, place.top, wide, high]);
  return place;
}

// Writes the label of a mark, with a line to the mark where it is aside.
function label(canvas, area, taken, text, x, y) {
  const wide = canvas.measureText(text).width + 4, high = 13;
  const place = placeOf(area, taken, wide, high, x, y);
  if (!place) return;
  if (place.isAside) {
    const side = place.left > x ? 1 : -1;
    canvas.lineWidth = 0.8;
    canvas.beginPath();
    canvas.moveTo(x + 4 * side, y);
    canvas.lineTo(side > 0 ? place.left : place.left + wide, place.top + high / 2);
    canvas.stroke();
  }
  canvas.lineWidth = 3;
  canvas.strokeStyle = colour("ground");
  canvas.strokeText(text, place.left + wide / 2, place.top + high - 3);
  canvas.strokeStyle = colour("grey");
  canvas.fillStyle = colour("text");
  canvas.fillText(text, place.left + wide / 2, place.top + high - 3);
}

function line(canvas, x, y, toX, toY, name) {
  canvas.strokeStyle = colour(name);
  canvas.setLineDash([5, 4]);
  canvas.lineWidth = 1.2;
  canvas.beginPath();
  canvas.moveTo(x, y);
  canvas.lineTo(toX === null ? x : toX, toY === null ? y : toY);
  canvas.stroke();
  canvas.setLineDash([]);
}

// A number as text.
function short(value, digits = 9) {
  if (value !== 0 && (Math.abs(value) >= 1e7 || Math.abs(value) < 1e-4)) {
    return Number(value.toPrecision(Math.min(7, digits))).toExponential();
  }
  return String(Number(value.toPrecision(digits)));
}

function bars(event) {
  const points = event.points, canvas = event.drawingContext;
  const gap = points.length > 1 ? points[1].canvasx - points[0].canvasx : event.plotArea.w / 2;
  const bottom = event.dygraph.toDomYCoord(0);
  canvas.fillStyle = event.color;
  for (const point of points) {
    canvas.fillRect(point.canvasx - 0.46 * gap, point.canvasy, 0.92 * gap, bottom - point.canvasy);
  }
}

function drawAll(plots, root = document, sourceOf = plot => new Inside(plot)) {
  for (let i = figures.length; i--;) if (!figures[i].element.isConnected) figures.splice(i, 1);
  for (const element of root.querySelectorAll("figure.plot")) {
    const i = Number(element.dataset.plot);
    figures.push(new Figure(element, plots[i], sourceOf(plots[i], i)));
  }
}

matchMedia("(prefers-color-scheme: dark)").addEventListener("change", () =>
  figures.forEach(figure => figure.draw(figure.window)));

const stored = document.getElementById("plots");
if (stored) drawAll(JSON.parse(stored.textContent));
