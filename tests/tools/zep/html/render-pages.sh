#!/usr/bin/env bash
# SPDX-License-Identifier: Apache-2.0
#
# Checks the pages of zep with tidy, and renders them in Chromium: light, dark, on a phone, and printed on A4. The pictures stay in
# SCREENSHOTS.
#
#   render-pages.sh ZEP SCREENSHOTS
set -euo pipefail
zep=$1 out=$2
for program in chromium tidy pdfinfo; do
  command -v "$program" >/dev/null || { echo "$program is not installed"; [[ ${CI:-} == true ]] && exit 1 || exit 77; }
done
work=$(mktemp -d)
trap 'rm -rf "$work"' EXIT
mkdir -p "$out"

"$zep" report --sample --json >"$work/a.json" || [[ $? == 2 ]]
sed 's/"Example Works"/"Other Works <b>\\u202e"/' "$work/a.json" >"$work/b.json"
"$zep" report --from "$work/a.json" --html "$out/report.html" || [[ $? == 2 ]]
"$zep" diff "$work/a.json" "$work/b.json" --html "$out/diff.html" || [[ $? == 1 ]]
for page in report diff; do
  tidy -quiet -errors "$out/$page.html"  # any warning fails
done

# HOME and XDG_*: a profile of its own, removed afterwards. As root, Chromium runs without its sandbox.
browse() {
  HOME=$work XDG_CONFIG_HOME=$work XDG_CACHE_HOME=$work timeout 60 chromium --headless --no-sandbox --disable-gpu --hide-scrollbars \
    --disable-dev-shm-usage --user-data-dir="$work/profile" "$@" >"$work/log" 2>&1 || { cat "$work/log"; exit 1; }
}
for page in report diff; do
  browse --window-size=1280,1600 --screenshot="$out/$page-light.png" "file://$out/$page.html"
  browse --window-size=1280,1600 --blink-settings=preferredColorScheme=0 --screenshot="$out/$page-dark.png" "file://$out/$page.html"
  browse --window-size=500,1400 --screenshot="$out/$page-narrow.png" "file://$out/$page.html"
done
browse --no-pdf-header-footer --print-to-pdf="$out/report.pdf" "file://$out/report.html"

cmp -s "$out/report-light.png" "$out/report-dark.png" && { echo "the page looks the same in light and dark" >&2; exit 1; }
pdfinfo "$out/report.pdf" | grep -q '^Page size: .*A4' || { pdfinfo "$out/report.pdf" >&2; exit 1; }

# No part is wider than the window of a phone: the text of the page, not that of a table that scrolls by itself.
cat >"$work/width.html" <<PAGE
<!DOCTYPE html><title>-</title><iframe src="file://$out/report.html" style="width:360px;height:800px"></iframe>
<script>onload = () => { const page = document.querySelector('iframe').contentDocument.documentElement;
document.title = 'width ' + page.scrollWidth; document.body.append(document.title) }</script>
PAGE
width=$(HOME=$work XDG_CONFIG_HOME=$work timeout 60 chromium --headless --no-sandbox --disable-gpu --allow-file-access-from-files \
  --user-data-dir="$work/profile" --dump-dom "file://$work/width.html" 2>/dev/null | grep -o 'width [0-9]*' | head -n 1)
[[ $width =~ ^width\ ([0-9]+)$ && ${BASH_REMATCH[1]} -le 360 ]] || { echo "on a phone of 360 pixels the page has the $width" >&2; exit 1; }
echo "the pictures are in $out"
