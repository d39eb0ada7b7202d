// The page of `view`. It fetches samples from the server as they are needed, and updates the sections for the
// chosen part, filter and window.
"use strict";

const form = document.querySelector("form.choices"), state = document.getElementById("state");
const base = location.pathname.endsWith(`/${form.dataset.file}/`) ? "" : `${form.dataset.file}/`;

async function ask(what, query, signal) {
  const response = await fetch(`${base}${what}?${new URLSearchParams(query)}`, {signal});
  const found = await response.json();
  if (!response.ok) throw new Error(found.error);
  return found;
}

function tell(text) {
  state.textContent = text;
}

// The samples of a channel, at the levels of detail that the server has.
class Remote {
  constructor(plot, channel) {
    Object.assign(this, {plot, channel, range: [0, Math.max(1, plot.count - 1) * plot.step]});
  }
  rows([from, to], most, then) {
    this.pending?.abort();
    this.pending = new AbortController();
    ask("data", {channel: this.channel, from: Math.max(0, from), to: Math.max(0, to), points: Math.round(most),
                 version: form.dataset.version}, this.pending.signal).then(found => {
      const place = i => found.start + i * found.step;
      const curve = {lows: numbers(found.lows), highs: found.highs && numbers(found.highs)};
      then(reduce([curve], place, 0, curve.lows.length, Infinity));
    }).catch(error => { if (error.name !== "AbortError") tell(error.message); });
  }
}

const channelPlots = JSON.parse(document.getElementById("channel-plots").textContent);
drawAll(channelPlots, document.getElementById("channels"), (plot, i) => new Remote(plot, i));

let asked = 0, waiting;

async function analyse() {
  const mine = ++asked, query = Object.fromEntries([...new FormData(form)].filter(([, value]) => value !== ""));
  try {
    const found = await ask("sections", query);
    if (mine !== asked) return;
    const target = document.getElementById("sections");
    target.innerHTML = found.html;
    drawAll(found.plots, target);
    tell("");
  } catch (error) {
    if (mine === asked) tell(error.message);
  }
}

// Shows only the fields that the chosen filter has; disabled fields are not sent.
function showFields() {
  const kind = form.elements.kind.value, edges = kind === "none" ? 0 : kind.startsWith("band") ? 2 : 1;
  for (const [name, used] of [["low", edges > 0], ["high", edges > 1], ["order", edges > 0]]) {
    form.elements[name].disabled = !used;
    form.elements[name].parentElement.hidden = !used;
  }
}

form.addEventListener("input", () => {
  showFields();
  clearTimeout(waiting);
  waiting = setTimeout(analyse, 300);
});
showFields();
form.addEventListener("submit", event => event.preventDefault());
document.getElementById("shown").addEventListener("click", () => {
  const [from, to] = figures[0].window;
  form.elements.from.value = Number(from.toPrecision(9));
  form.elements.to.value = Number(to.toPrecision(9));
  analyse();
});

setInterval(async () => {
  try {
    const found = await ask("state", {});
    if (found.state === "gone") tell("The file no longer exists. The page shows what was read from it.");
    else if (found.state === "changed" || String(found.version) !== form.dataset.version) {
      tell("The file has changed: reload the page to read it again.");
    }
  } catch (error) {
    tell("The server does not answer: it may have been stopped.");
  }
}, 1000);

analyse();
