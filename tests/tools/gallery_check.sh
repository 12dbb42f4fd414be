#!/usr/bin/env bash
# Builds the gallery of the sample portrait and opens it in headless Chromium:
# every picture on the page must decode, and every link must lead to a file.
# Exit 77 (skipped) when Chromium is not installed.
set -euo pipefail
pxfx=${1:?usage: gallery_check.sh PXFX_BINARY}
browser=$(command -v chromium || command -v chromium-browser || true)
if [ -z "$browser" ]; then
  echo "chromium not installed: skipped"
  exit 77
fi
work=$(mktemp -d)
trap 'rm -rf "$work"' EXIT
"$pxfx" gallery -o "$work/gallery" >/dev/null

missing=0
while read -r target; do
  [ -f "$work/gallery/$target" ] || { echo "missing link target: $target"; missing=1; }
done < <(grep -o 'href="[^"]*"' "$work/gallery/index.html" | sed 's/href="//; s/"$//')

cat > "$work/gallery/check.html" <<'HTML'
<!doctype html><html><body><iframe id="f" src="index.html" style="width:1200px;height:900px"></iframe>
<pre id="out">pending</pre>
<script>
document.getElementById('f').addEventListener('load', () => {
  const imgs = Array.from(document.getElementById('f').contentDocument.images);
  const bad = imgs.filter(i => !(i.complete && i.naturalWidth > 0)).map(i => i.getAttribute('src'));
  document.getElementById('out').textContent =
    'RESULT images=' + imgs.length + ' broken=' + bad.length + ' ' + bad.join(',');
});
</script></body></html>
HTML
result=$(timeout 120 "$browser" --headless --no-sandbox --disable-gpu --disable-quic --no-first-run \
  --disable-background-networking --disable-component-update --disable-sync \
  --user-data-dir="$work/profile" --allow-file-access-from-files --virtual-time-budget=20000 \
  --dump-dom "file://$work/gallery/check.html" 2>/dev/null | grep -o 'RESULT images=[0-9]* broken=[0-9]*[^<]*' || true)
echo "${result:-no result from the browser}"
images=$(sed -n 's/.*images=\([0-9]*\).*/\1/p' <<<"$result")
broken=$(sed -n 's/.*broken=\([0-9]*\).*/\1/p' <<<"$result")
[ -n "$images" ] && [ "$images" -gt 0 ] && [ "$broken" = 0 ] && [ "$missing" = 0 ]
