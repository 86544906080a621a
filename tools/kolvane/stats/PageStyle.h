// How the page looks: light or dark as the reader's system is, and light on paper. On a narrow
// screen each row of the table becomes a block of its own.
#pragma once

#include <string_view>

inline constexpr std::string_view kPageStyle = R"(
:root { color-scheme: light dark; --page: #fff; --text: #1c2329; --quiet: #56616c; --line: #d5dadf;
  --translated: #1b7a5e; --identical: #c77d0a; --missing: #e9ecef; --empty: #e4e8eb;
  --c1: #8fb4da; --c2: #6594c8; --c3: #4176b3; --c4: #2a5a94; --c5: #1a4070; --c6: #0d274a; }
@media screen and (prefers-color-scheme: dark) {
  :root { --page: #15191d; --text: #e4e8eb; --quiet: #9ba7b2; --line: #363e46;
    --translated: #45b08c; --identical: #dba03f; --missing: #2b3238; --empty: #262c32;
    --c1: #2c5583; --c2: #3b72ac; --c3: #5590cf; --c4: #7eafe0; --c5: #accdee; --c6: #e0eefb; }
}
* { box-sizing: border-box; }
body { margin: 0; background: var(--page); color: var(--text);
  font: 1rem/1.5 system-ui, "Segoe UI", "Noto Sans", "DejaVu Sans", sans-serif; }
main { max-width: 68rem; margin: 0 auto; padding: 2.5rem 1.5rem; }
h1, h2 { font-weight: 600; line-height: 1.25; margin: 0 0 .25rem; overflow-wrap: anywhere; }
h1 { font-size: 1.6rem; }
h2 { font-size: 1.2rem; margin-top: 3rem; }
p { margin: 0 0 1.25rem; color: var(--quiet); max-width: 42rem; overflow-wrap: anywhere; }
table { width: 100%; border-collapse: collapse; font-variant-numeric: tabular-nums; }
th, td { padding: .6rem 0 .6rem 1.25rem; text-align: right; border-bottom: 1px solid var(--line); }
th:first-child { padding-left: 0; text-align: left; overflow-wrap: anywhere; }
thead th { font-size: .85rem; font-weight: 400; color: var(--quiet); white-space: nowrap; }
tbody th { font-weight: 600; min-width: 8rem; }
.bar { width: 34%; text-align: left; }
.bar svg { display: block; width: 100%; height: 1rem; border: 1px solid var(--quiet); }
.percent { font-weight: 600; white-space: nowrap; }
ul { list-style: none; margin: 0 0 .75rem; padding: 0; display: flex; flex-wrap: wrap;
  gap: .15rem 1.25rem; font-size: .85rem; font-variant-numeric: tabular-nums; }
li { white-space: nowrap; }
li svg { width: .8rem; height: .8rem; margin-right: .4rem; vertical-align: -.08em;
  border: 1px solid var(--quiet); }
.translated { fill: var(--translated); } .identical { fill: url(#hatch); }
.missing { fill: var(--missing); }
.hatch-ground { fill: var(--page); } .hatch-line { stroke: var(--identical); }
.figures { display: grid; grid-template-columns: repeat(auto-fill, minmax(19rem, 1fr));
  gap: 2rem 2.5rem; }
figure { margin: 0; break-inside: avoid; min-width: 0; }
figure svg.buckets { display: block; width: 100%; margin: .4rem 0 .6rem; }
figure ul { display: grid; grid-template-columns: repeat(3, auto); justify-content: start;
  column-gap: 1rem; }
figcaption b { display: block; font-weight: 600; overflow-wrap: anywhere; }
figcaption { font-size: .85rem; color: var(--quiet); } figure ul { display: grid; grid-template-columns: repeat(3, auto); justify-content: start;
  column-gap: 1rem; }
figcaption b { color: var(--text); }
.buckets path { stroke-width: .8; fill: none; }
.k0 { fill: var(--empty); stroke: var(--empty); } .k1 { fill: var(--c1); stroke: var(--c1); }
.k2 { fill: var(--c2); stroke: var(--c2); } .k3 { fill: var(--c3); stroke: var(--c3); }
.k4 { fill: var(--c4); stroke: var(--c4); } .k5 { fill: var(--c5); stroke: var(--c5); }
.k6 { fill: var(--c6); stroke: var(--c6); }
tr { break-inside: avoid; }
h2, h2 + p { break-after: avoid; }
@media print {
  body { font-size: .8rem; }
  main { padding: 0; }
  th, td { padding-left: .7rem; }
  .bar { width: 25%; }
}
@media screen and (max-width: 46rem) {
  main { padding: 1.5rem 1rem; }
  thead { position: absolute; clip-path: inset(50%); }
  table, tbody { display: block; }
  tbody tr { display: grid; grid-template-columns: repeat(4, 1fr); gap: .3rem .5rem;
    padding: .9rem 0; border-bottom: 1px solid var(--line); }
  tbody th, tbody td { padding: 0; border: 0; text-align: left; }
  tbody th { grid-column: 1 / -1; }
  .bar { grid-column: 1 / -1; width: auto; order: 1; }
  td[data-name] { order: 2; }
  td[data-name]::before { content: attr(data-name); display: block; font-weight: 400;
    font-size: .75rem; color: var(--quiet); }
}
)";
