#!/usr/bin/env bash
# Renders the icon's drawing (vantori-verifier.svg) into the PNG sizes the desktop's icon
# theme uses and into the Windows icon (vantori-verifier.ico), all kept beside it. Run after
# a change of the drawing; needs rsvg-convert (librsvg2-bin) and icotool (icoutils).
set -euo pipefail
cd "$(dirname "$0")"
sizes=(16 24 32 48 64 128 256)
for size in "${sizes[@]}"; do
    rsvg-convert -w "$size" -h "$size" vantori-verifier.svg -o "vantori-verifier-$size.png"
done
# The largest size is kept as PNG inside the icon, as Windows allows, to keep the file small.
icotool -c -o vantori-verifier.ico vantori-verifier-{16,24,32,48,64}.png -r vantori-verifier-256.png
