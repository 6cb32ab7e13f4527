#ifndef MCBIN_PAGESTYLE_H
#define MCBIN_PAGESTYLE_H

/// How the page looks. The classes c0, c1, ... are the colours of the categories, which colour-blind people can tell
/// apart; c7 is for all that have none of their own.
inline constexpr const char* kPageStyle = R"(
:root { --ground: #fff; --ink: #1b1f24; --soft: #667080; --line: #d8dde4; --bar: #7d8a9c; --meter: #cfe0f4;
  --c0: #0072b2; --c1: #e69f00; --c2: #009e73; --c3: #cc79a7; --c4: #56b4e9; --c5: #d55e00; --c6: #d8cc2c; --c7: #a4abb5; }
@media (prefers-color-scheme: dark) {
  :root { --ground: #14171c; --ink: #e4e8ee; --soft: #9aa5b4; --line: #333a45; --bar: #66758a; --meter: #24405f;
    --c0: #3c96d2; --c1: #e8ab2e; --c2: #27b58b; --c3: #d592b8; --c4: #8accf2; --c5: #e57b35; --c6: #e6dc5c; --c7: #68707c; } }
body { margin: 0 auto; padding: 1rem; max-width: 60rem; background: var(--ground); color: var(--ink);
  font: 16px/1.5 system-ui, sans-serif; }
h1 { font-size: 1.5rem; line-height: 1.25; overflow-wrap: anywhere; }
h2 { font-size: 1.2rem; margin: 2.2rem 0 .3rem; overflow-wrap: anywhere; }
p { margin: .3rem 0 .8rem; }
small { color: var(--soft); font-weight: normal; font-size: .85em; }
a { color: inherit; }
.scroll { overflow-x: auto; margin: .6rem 0; }
table { border-collapse: collapse; font-size: .9rem; font-variant-numeric: tabular-nums; }
th, td { padding: .25rem .7rem; text-align: right; white-space: nowrap; border-bottom: 1px solid var(--line); }
th { color: var(--soft); font-weight: 600; }
th:first-child, td:first-child { text-align: left; padding-left: 0; }
.meter { position: relative; min-width: 5rem; }
.meter span { position: absolute; left: .3rem; top: 20%; height: 60%; max-width: calc(100% - .6rem); background: var(--meter);
  z-index: -1; border-radius: 2px; }
svg { display: block; width: 100%; max-width: 40rem; height: auto; }
svg text { fill: var(--soft); font: 11px system-ui, sans-serif; }
svg .axis { stroke: var(--line); }
svg .weight { fill: var(--bar); }
svg .first { fill: var(--soft); } svg .second { fill: var(--c0); }
svg polyline { fill: none; stroke-width: 1.5; } svg .curve { stroke: var(--c5); } svg circle.curve { fill: var(--c5); }
svg polyline.first { stroke: var(--soft); } svg polyline.second { stroke: var(--c0); }
svg.spark { display: inline-block; width: 4.5rem; height: 1.1rem; vertical-align: middle; }
.flag { color: var(--c5); font-weight: 600; }
td.flag { white-space: normal; text-align: left; }
.key { display: flex; flex-wrap: wrap; gap: .1rem 1rem; margin: .3rem 0; padding: 0; list-style: none; font-size: .9rem; }
.key i { display: inline-block; width: .8em; height: .8em; margin-right: .4em; border-radius: 2px; }
.c0 { fill: var(--c0); background: var(--c0); } .c1 { fill: var(--c1); background: var(--c1); }
.c2 { fill: var(--c2); background: var(--c2); } .c3 { fill: var(--c3); background: var(--c3); }
.c4 { fill: var(--c4); background: var(--c4); } .c5 { fill: var(--c5); background: var(--c5); }
.c6 { fill: var(--c6); background: var(--c6); } .c7 { fill: var(--c7); background: var(--c7); }
@media (max-width: 36rem) { th, td { padding: .25rem .4rem; font-size: .8rem; } .meter { min-width: 4.5rem; } }
details { margin: .6rem 0; } summary { cursor: pointer; color: var(--soft); }
@media print { section { break-inside: avoid; } }
)";

#endif
