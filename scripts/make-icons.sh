#!/usr/bin/env bash
# Renders the program's SVG icon into the PNG sizes of the hicolor theme (data/desktop/icons/).
# Run after changing the SVG; the PNGs are committed, so a build needs no SVG renderer.
set -euo pipefail
top=$(cd "$(dirname "$0")/.." && pwd)
svg=$top/data/desktop/io.velmorant.AudioConverter.svg
for size in 16 22 24 32 48 64 128 256; do
  dir=$top/data/desktop/icons/hicolor/${size}x${size}/apps
  mkdir -p "$dir"
  rsvg-convert -w "$size" -h "$size" "$svg" -o "$dir/io.velmorant.AudioConverter.png"
done
echo "make-icons: $(ls "$top/data/desktop/icons/hicolor" | tr '\n' ' ')"
