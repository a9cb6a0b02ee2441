// SPDX-License-Identifier: Apache-2.0
#pragma once

namespace NQRVZEP20::zep {

// The style sheet of the pages. All colours of text have a contrast of 4.5 or more on their background.
constexpr char const* kStyle =
    R"(:root{color-scheme:light dark;--bg:#f4f6f8;--card:#fff;--text:#1b2430;--soft:#536072;--line:#d9dfe7;
--link:#0b5cad;--critical:#9b0020;--error:#b3261e;--warning:#855000;--information:#0b5cad;--fine:#176639}
@media (prefers-color-scheme:dark){:root{--bg:#11151b;--card:#1a2029;--text:#e6eaf0;--soft:#a3b0c0;--line:#303a48;
--link:#7ab8ff;--critical:#ff7a90;--error:#ff8a80;--warning:#ffc266;--information:#7ab8ff;--fine:#7bd69b}}
*{box-sizing:border-box}
html{scroll-padding-top:1rem}
body{margin:0;background:var(--bg);color:var(--text);font:1rem/1.5 system-ui,-apple-system,"Segoe UI",Roboto,"DejaVu Sans",sans-serif;
overflow-wrap:anywhere}
a{color:var(--link);text-underline-offset:.15em}
:focus-visible{outline:3px solid var(--link);outline-offset:2px;border-radius:4px}
.skip{position:absolute;left:-99rem}
.skip:focus{left:1rem;top:1rem;background:var(--card);padding:.5rem 1rem;z-index:1}
header,.page,footer{max-width:76rem;margin:0 auto;padding:0 1.25rem}
header{padding-top:2.5rem;padding-bottom:1.5rem}
header p{margin:0}
.about,.soft,footer{color:var(--soft);font-size:.875rem}
h1{font-size:clamp(1.5rem,1.1rem + 1.6vw,2.25rem);line-height:1.2;letter-spacing:-.01em;margin:.5rem 0 .625rem;text-wrap:balance}
header .system{font-size:1.125rem;color:var(--soft)}
.page{display:grid;grid-template-columns:minmax(0,1fr);gap:1.5rem}
main{min-width:0;display:grid;grid-template-columns:minmax(0,1fr);gap:1rem}
nav h2{font-size:.8125rem;text-transform:uppercase;letter-spacing:.06em;color:var(--soft);margin:0 0 .5rem}
nav ul{list-style:none;margin:0;padding:0;display:flex;flex-wrap:wrap;gap:.25rem 1rem}
nav a{display:inline-block;padding:.2rem 0;text-decoration:none}
nav a:hover{text-decoration:underline}
.count{color:var(--soft);font-size:.8125rem;font-weight:400;margin-left:.35rem;font-variant-numeric:tabular-nums}
@media (min-width:62rem){.page:not(.one){grid-template-columns:13rem minmax(0,1fr);gap:2.5rem}
nav{position:sticky;top:1.5rem;align-self:start;max-height:calc(100vh - 3rem);overflow:auto}nav ul{display:block}}
.card{background:var(--card);border:1px solid var(--line);border-radius:10px;padding:1rem 1.25rem}
h2,.h2{font-size:1.125rem;line-height:1.3;font-weight:700;margin:0}
.h3{font-weight:700}
h4{font-size:.9375rem;margin:0}
summary{cursor:pointer}
.card>details[open]>summary{margin-bottom:.75rem}
.verdict{font-size:1.5rem;line-height:1.25;font-weight:650;margin:.35rem 0 .75rem}
.problems{list-style:none;margin:.625rem 0 .75rem;padding:0;display:grid;gap:.625rem}
.problems li{border-left:5px solid;border-radius:4px;padding:.4rem .9rem;background:var(--bg)}
.problems p{margin:0;color:var(--text)}
.problems .what{font-size:1.0625rem;font-weight:600}
.severity{font-size:.75rem;font-weight:700;text-transform:uppercase;letter-spacing:.06em}
.critical{color:var(--critical)}.error{color:var(--error)}.warning{color:var(--warning)}.information{color:var(--information)}
.fine{color:var(--fine)}
.scroll{overflow-x:auto}
table{border-collapse:collapse;width:100%;font-size:.9375rem;overflow-wrap:normal}
th,td{text-align:left;vertical-align:top;padding:.4rem 1.25rem .4rem 0;border-top:1px solid var(--line);overflow-wrap:break-word}
td,tbody th{max-width:28rem}tbody th{min-width:7rem}
thead th{border-top:0;color:var(--soft);font-size:.8125rem;font-weight:600}
tbody th{font-weight:600}
.none{color:var(--soft);font-style:italic}
.object{border-top:1px solid var(--line);padding:.75rem 0}
.class>summary{padding:.35rem 0}
dl{display:grid;grid-template-columns:minmax(8rem,16rem) minmax(0,1fr);gap:.1rem 1rem;margin:.35rem 0 0;font-size:.875rem}
dt{color:var(--soft)}dd{margin:0}
@media (max-width:34rem){dl{grid-template-columns:1fr}dd{margin-bottom:.35rem}.card{padding:.875rem 1rem}}
del{color:var(--error)}ins{color:var(--fine);text-decoration:none}
footer{padding-top:2rem;padding-bottom:2.5rem}
@page{size:A4;margin:16mm 14mm}
@media print{:root{color-scheme:light;--bg:#fff;--card:#fff;--text:#000;--soft:#444;--line:#bbb;--link:#000;--critical:#9b0020;
--error:#b3261e;--warning:#855000;--information:#0b5cad;--fine:#176639}
body{font-size:9.5pt}nav,.skip,.screen{display:none}header,.page,footer{max-width:none;padding-left:0;padding-right:0}
header{padding-top:0}.page{display:block}.card{border:0;border-radius:0;padding:0 0 5mm}
.problems li{background:none}tr,.object,.problems li{break-inside:avoid}summary{break-after:avoid;list-style:none}
summary::-webkit-details-marker{display:none}.scroll{overflow:visible}td,tbody th{max-width:none}td{min-width:0;overflow-wrap:anywhere}}
)";

}  // namespace NQRVZEP20::zep
