#pragma once

namespace velmora {

// Marks are told by a word, a weight and a line at the side, so that they survive a printer without background colours.
inline constexpr char const* htmlStyle = R"css(:root { color-scheme: light dark; }
body { font: 15px/1.45 system-ui, sans-serif; margin: 0 auto; max-width: 60rem; padding: 1rem; }
h1 { font-size: 1.6rem; margin: 0 0 .5rem; }
h2 { border-bottom: 2px solid; font-size: 1.25rem; margin: 1.6rem 0 .5rem; }
h3 { font-size: 1.05rem; margin: 1.1rem 0 .3rem; }
table { border-collapse: collapse; margin: .3rem 0 .8rem; width: 100%; }
th, td { border-bottom: 1px solid #8888; overflow-wrap: anywhere; padding: .2rem .5rem .2rem 0; text-align: left;
         vertical-align: top; }
thead th { border-bottom: 2px solid #888; }
table.facts th { font-weight: 600; width: 13rem; }
.number { font-variant-numeric: tabular-nums; text-align: right; white-space: nowrap; }
.bad { font-weight: 700; }
td.bad, p.bad { border-left: .3rem solid #b00020; padding-left: .4rem; }
td.warning, p.warning { border-left: .3rem solid #a66300; padding-left: .4rem; }
td.good, p.good { border-left: .3rem solid #1b7f3b; padding-left: .4rem; }
.faint { font-style: italic; }
svg.bar { vertical-align: middle; }
svg .outside { fill: none; stroke: #888; stroke-width: .6; }
svg .inside { fill: #888; }
svg .value { fill: CanvasText; }
footer { border-top: 1px solid #888; font-size: .85rem; margin-top: 2rem; }
@media (max-width: 40rem) { table.facts th { width: 40%; } svg.bar { display: block; } }
@media print {
  body { color: #000; font-size: 10pt; max-width: none; padding: 0; }
  thead { display: table-header-group; }
  tr { break-inside: avoid; }
  h2, h3 { break-after: avoid; }
  svg .value { fill: #000; }
}
@page { margin: 15mm; }
)css";

} // namespace velmora
