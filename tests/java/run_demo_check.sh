#!/bin/bash
# Runs the demo headless (no display) for a few frames at an odd size and
# checks the PNG it writes.
#   run_demo_check.sh <java> <product jar> <test jar> <library dir> <output dir>
set -euo pipefail
java=$1; productjar=$2; testjar=$3; libdir=$4; outdir=$5
# 333x250: the four animated cells in one row; 800x600: cells beside the
# 2D primitives panel.
for size in 333x250 800x600; do
    png=$outdir/demo_check_$size.png
    rm -f "$png"
    env -u DISPLAY "$java" -Djava.library.path="$libdir" -cp "$productjar" Demo --headless --frames 5 \
        --size "$size" --out "$png"
    "$java" -Djava.awt.headless=true -cp "$testjar:$productjar" DemoPngCheck "$png" "${size%x*}" "${size#*x}"
done
