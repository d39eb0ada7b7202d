"""The style that all pages share."""

# For all pages: plots in the size of the window, and dark where the reader prefers it. The drawings
# have no ground of their own, so turning their colours round does it for them.
COMMON_STYLE = """
:root { color-scheme: light dark; --text: #1f2d3d; --ground: #fff; --quiet: #5b6b7d; --line: #dfe5ec;
        --shade: #f5f7fa; --link: #2f6db3; }
body { font: 15px/1.5 "DejaVu Sans", "Segoe UI", Helvetica, Arial, sans-serif; color: var(--text);
       max-width: 62em; margin: 2em auto; padding: 0 1.2em; background: var(--ground); }
figure { margin: 0 0 .6em; } figure svg { width: 100%; height: auto; } figure svg.narrow { display: none; }
@media (max-width: 640px) { body { margin: 1em auto; padding: 0 .8em; }
  figure svg.wide:not(:only-child) { display: none; } figure svg.narrow { display: block; } }
@media (prefers-color-scheme: dark) {
  :root { --text: #dde4ec; --ground: #15191e; --quiet: #93a1b1; --line: #303a45; --shade: #1d232a;
          --link: #7db2ea; }
  figure svg { filter: invert(1) hue-rotate(180deg); } }
@media print { figure svg.narrow { display: none; } }
"""
HEAD = ('<meta charset="utf-8"><meta name="viewport" content="width=device-width, initial-scale=1">')

STYLE = COMMON_STYLE + """
h1 { font-size: 1.6em; margin-bottom: .1em; overflow-wrap: anywhere; } h2 { font-size: 1.15em;
     margin: 1.8em 0 .4em; border-bottom: 1px solid var(--line); padding-bottom: .2em; }
p.source { color: var(--quiet); margin: .2em 0; overflow-wrap: anywhere; }
table { border-collapse: collapse; } td, th { padding: .22em 1.4em .22em 0; text-align: left;
     border-bottom: 1px solid var(--line); } td.value { text-align: right; white-space: nowrap;
     font-variant-numeric: tabular-nums; padding-right: .5em; } td.export { color: var(--quiet);
     font-family: "DejaVu Sans Mono", Consolas, monospace; font-size: .86em; overflow-wrap: anywhere; }
table + figure { margin-top: 1em; } footer { margin-top: 3em; color: var(--quiet); font-size: .85em; }
@media (max-width: 640px) { td, th { padding-right: .6em; } td.export { font-size: .7em; } }
"""
