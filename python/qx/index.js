// Sorts a table by the column whose name is clicked: numbers by value, other cells as texts.
"use strict";

for (const table of document.querySelectorAll("table.sorted")) {
  const head = [...table.tHead.rows[0].cells];
  head.forEach((cell, column) => cell.querySelector("button")?.addEventListener("click", () => {
    const falls = cell.getAttribute("aria-sort") === "ascending", key = row => {
      const text = row.cells[column].textContent, value = parseFloat(text);
      return column > 1 ? (isNaN(value) ? -Infinity : value) : text;
    };
    const rows = [...table.tBodies[0].rows].map(row => [key(row), row]);
    rows.sort(([a], [b]) => (typeof a === "string" ? a.localeCompare(b, undefined, {numeric: true}) : a - b || 0));
    if (falls) rows.reverse();
    table.tBodies[0].append(...rows.map(([, row]) => row));
    head.forEach(other => other.removeAttribute("aria-sort"));
    cell.setAttribute("aria-sort", falls ? "descending" : "ascending");
  }));
}
