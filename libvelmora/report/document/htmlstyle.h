#pragma once

namespace velmora {

// Marks are told by a word, a weight and a border, so that they survive a printer without background colours and eyes
// that don't see the hues. Text on its ground has a contrast of 4.5:1 or more, borders of marks 3:1.
inline constexpr char const* htmlStyle = R"css(:root {
  color-scheme: light dark;
  --ground: #f6f7f9; --sheet: #fff; --ink: #1b1f24; --soft: #545b66; --line: #d5d9e0; --strong: #8a919c;
  --good: #17703a; --warning: #8f5200; --bad: #b00020; --accent: #1656a5; --range: #a9c3e6;
}
@media (prefers-color-scheme: dark) {
  :root {
    --ground: #14171b; --sheet: #1c2026; --ink: #e6e9ee; --soft: #a4acb8; --line: #343a43; --strong: #79818d;
    --good: #62c98a; --warning: #e8a94a; --bad: #ff8a8a; --accent: #8ab8f5; --range: #3c5f8d;
  }
}
* { box-sizing: border-box; }
html { scroll-behavior: auto; }
body { background: var(--ground); color: var(--ink); font: 15px/1.5 system-ui, "Segoe UI", Roboto, "DejaVu Sans",
       sans-serif; margin: 0 auto; max-width: 62rem; padding: 1.5rem 1rem 3rem; }
h1 { font-size: 1.75rem; letter-spacing: -.01em; line-height: 1.2; margin: 0 0 .75rem; }
h2 { font-size: 1.2rem; line-height: 1.3; margin: 0 0 .75rem; }
h3 { font-size: 1rem; margin: 0 0 .4rem; }
p { margin: .25rem 0 .6rem; }
a { color: var(--accent); text-underline-offset: .15em; }
nav ul { display: flex; flex-wrap: wrap; gap: .3rem 1.1rem; list-style: none; margin: 0 0 1rem; padding: 0; }
section.level2 { background: var(--sheet); border: 1px solid var(--line); border-radius: .6rem; margin: 0 0 1rem;
                 padding: 1rem 1.1rem .6rem; }
section.level3 { margin: 0 0 1rem; padding: 0 .1rem; }
main > section.level3 { border-left: 3px solid var(--line); margin-left: .4rem; padding-left: .9rem; }
section:target { outline: 2px solid var(--accent); outline-offset: .25rem; }
table { border-collapse: collapse; margin: .2rem 0 .9rem; width: 100%; }
th, td { border-bottom: 1px solid var(--line); overflow-wrap: anywhere; padding: .32rem .7rem .32rem 0; text-align: left;
         vertical-align: top; }
th:last-child, td:last-child { padding-right: 0; }
thead th { border-bottom: 2px solid var(--strong); color: var(--soft); font-size: .85rem; font-weight: 600; }
table.facts th { color: var(--soft); font-weight: 500; width: 15rem; }
.number { font-variant-numeric: tabular-nums; text-align: right; }
thead th.number { text-align: right; }
.mark { border-left: .22rem solid; font-weight: 600; padding-left: .4rem; }
.good .mark { color: var(--good); }
.warning .mark { color: var(--warning); }
.bad .mark { color: var(--bad); }
.bad .mark { font-weight: 700; }
.faint { color: var(--soft); font-style: italic; }
dl.tiles { display: grid; gap: .7rem; grid-template-columns: repeat(auto-fit, minmax(9rem, 1fr)); margin: 0 0 .6rem; }
dl.tiles > div { border: 1px solid var(--line); border-radius: .5rem; padding: .55rem .7rem; }
dl.tiles dt { color: var(--soft); font-size: .85rem; }
dl.tiles dd { font-size: 1.25rem; font-variant-numeric: tabular-nums; font-weight: 600; margin: .1rem 0 0; }
.note { border: 1px solid var(--line); border-left: .3rem solid var(--strong); border-radius: .4rem; margin: 0 0 .8rem;
        padding: .6rem .9rem .3rem; }
.note.warning { border-left-color: var(--warning); }
.note.bad { border-left-color: var(--bad); }
.note .title { font-weight: 600; margin: 0 0 .2rem; }
.note .label { color: var(--soft); font-size: .85rem; margin: .4rem 0 0; }
.note ul { margin: .1rem 0 .5rem; padding-left: 1.2rem; }
svg.bar { display: inline-block; margin-left: .4rem; vertical-align: middle; }
svg .track { fill: none; stroke: var(--strong); stroke-width: 1; }
svg .range { fill: var(--range); }
svg .needle { fill: var(--ink); }
svg .out { fill: var(--bad); }
footer { color: var(--soft); font-size: .85rem; margin-top: 1.5rem; }
@media (min-width: 44.01rem), print { td:first-child, td.number, thead th { overflow-wrap: break-word; } }
@media screen and (max-width: 44rem) {
  body { padding: 1rem .6rem 2rem; }
  section.level2 { padding: .8rem .7rem .4rem; }
  main > section.level3 { margin-left: .1rem; padding-left: .6rem; }
  table.facts th { width: 42%; }
  table.facts td:last-child { overflow-wrap: anywhere; }
  th, td { padding-right: .4rem; }
  td:last-child { overflow-wrap: break-word; }
  .wide thead { clip-path: inset(50%); height: 1px; overflow: hidden; position: absolute; width: 1px; }
  .wide, .wide tbody, .wide tr { display: block; }
  .wide tr { border-bottom: 2px solid var(--line); padding: .35rem 0; }
  .wide td { border: 0; display: flex; gap: 1rem; justify-content: space-between; padding: .12rem 0; text-align: right; }
  .wide td::before { color: var(--soft); content: attr(data-head); flex: 1 1 auto; font-size: .85rem; font-style: normal;
                     font-weight: 400; text-align: left; }
}
@media print {
  :root { --ground: #fff; --sheet: #fff; --ink: #000; --soft: #444; --line: #bbb; --strong: #666; --good: #0d5a2c;
          --warning: #7a4500; --bad: #a0001c; --accent: #000; --range: #9db8dc; }
  body { font-size: 9.5pt; line-height: 1.35; max-width: none; padding: 0; }
  nav { display: none; }
  a { text-decoration: none; }
  section.level2 { border: 0; border-radius: 0; border-top: 1.5pt solid #000; padding: .4rem 0 0; }
  main > section.level3 { border-left: 0; margin-left: 0; padding-left: 0; }
  thead { display: table-header-group; }
  tr, .note, dl.tiles > div { break-inside: avoid; }
  h2, h3, .label { break-after: avoid; }
  th, td { padding-bottom: .15rem; padding-top: .15rem; }
}
@page { margin: 15mm 12mm 18mm; @bottom-right { content: counter(page) " / " counter(pages); } }
)css";

} // namespace velmora
