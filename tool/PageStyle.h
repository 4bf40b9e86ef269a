// How the page of `norvexctl show --html` looks: light and dark, wide and narrow, on paper.
//
// Used by StoragePage.cpp alone.
#pragma once

namespace norvex {

// The colours of the charts, --s1 to --s7, keep a contrast of 3:1 against the cards, in both schemes.
inline constexpr const char* kPageStyle = R"css(
:root {
  color-scheme: light dark;
  --page: #f4f4f1; --card: #fff; --line: #e2e1dc; --text: #191917; --quiet: #5c5b56; --track: #e7e6e1;
  --s1: #2a78d6; --s2: #c2410c; --s3: #15803d; --s4: #9333ea; --s5: #b7791f; --s6: #be185d; --s7: #64748b;
}
@media (prefers-color-scheme: dark) {
  :root {
    --page: #131312; --card: #1e1e1c; --line: #35342f; --text: #f2f1ec; --quiet: #b3b1a8; --track: #34332f;
    --s1: #5b9df0; --s2: #f08a4b; --s3: #4cb872; --s4: #b98af5; --s5: #dcae45; --s6: #ee7fae; --s7: #94a3b8;
  }
}
* { box-sizing: border-box; }
body { margin: 0; background: var(--page); color: var(--text); font: 1rem/1.5 system-ui, sans-serif; }
main { max-width: 60rem; margin: 0 auto; padding: 1.5rem 1rem 3rem; }
h1 { font-size: clamp(1.5rem, 6vw, 1.75rem); line-height: 1.2; margin: 0 0 .25rem; }
h2 { font-size: 1.125rem; margin: 0 0 .5rem; }
h3 { font-size: 1rem; margin: 0; overflow-wrap: anywhere; }
p { margin: 0 0 .75rem; }
.quiet { color: var(--quiet); font-size: .875rem; }
.cards { display: grid; gap: 1rem; grid-template-columns: repeat(auto-fit, minmax(min(100%, 24rem), 1fr)); }
.card { background: var(--card); border: 1px solid var(--line); border-radius: .75rem; padding: 1rem 1.25rem; }
.wide { grid-column: 1 / -1; }
.volume + .volume { margin-top: 1rem; }
.volume p { margin: 0; }
.strip { display: block; width: 100%; height: 1.75rem; margin: .25rem 0 .5rem; border-radius: .375rem; }
.strip rect { stroke: var(--card); stroke-width: 2; }
.bar { display: block; width: 100%; height: .375rem; margin: .25rem 0 0; }
.track { fill: var(--track); }
.s1 { fill: var(--s1); } .s2 { fill: var(--s2); } .s3 { fill: var(--s3); } .s4 { fill: var(--s4); }
.s5 { fill: var(--s5); } .s6 { fill: var(--s6); } .s7 { fill: var(--s7); }
table { width: 100%; border-collapse: collapse; }
th, td { padding: .375rem 0; text-align: left; font-weight: normal; vertical-align: top; }
thead th { color: var(--quiet); font-size: .8125rem; border-bottom: 1px solid var(--line); }
th + td, td + td, thead th + th { text-align: right; padding-left: 1rem; white-space: nowrap; width: 1%; }
table + p { margin: .75rem 0 0; }
td { font-variant-numeric: tabular-nums; }
footer { margin-top: 1.5rem; }
@media print { .card { break-inside: avoid; } }
)css";

}  // namespace norvex
