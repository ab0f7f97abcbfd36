#!/bin/bash
# Presentation and demo figures, which need the JVM and an X server: starts an
# Xvfb (1280x1024x24, -displayfd) and stops it by its PID, builds the Java side
# in build/, then
#   - FlipBench: flips per second of a 1024x768 canvas, MIT-SHM vs XPutImage;
#   - the demo at 1024x768: headless (offscreen sprite) and in a window,
#     unthrottled, reporting its time per frame.
# Writes the ratio lines to build-bench/bench/canvas.ratios as well.
set -euo pipefail
cd "$(dirname "$0")/.."
cmake -S . -B build -DCMAKE_BUILD_TYPE=Release >/dev/null
cmake --build build -j"$(nproc)" --target pavoqen_sse pavoqen_testnatives pavoqen pavoqen_tests >/dev/null
mkdir -p build-bench/java build-bench/bench
javac -d build-bench/java -cp build/java/pavoqen.jar:build/tests/java/pavoqen_tests.jar bench/java/FlipBench.java

tmp=$(mktemp -d)
XVFB_PID=
cleanup() {
    if [ -n "$XVFB_PID" ]; then kill "$XVFB_PID" 2>/dev/null; wait "$XVFB_PID" 2>/dev/null; fi
    rm -rf "$tmp"
}
trap cleanup EXIT
Xvfb -displayfd 9 -screen 0 1280x1024x24 -nolisten tcp 9>"$tmp/display" >"$tmp/xvfb.log" 2>&1 &
XVFB_PID=$!
for _ in $(seq 200); do grep -q '^[0-9]' "$tmp/display" 2>/dev/null && break; sleep 0.05; done
grep -q '^[0-9]' "$tmp/display" || { echo "canvas bench: Xvfb did not start" >&2; cat "$tmp/xvfb.log" >&2; exit 1; }
export DISPLAY=":$(head -1 "$tmp/display" | tr -d '[:space:]')"

cp=build-bench/java:build/java/pavoqen.jar:build/tests/java/pavoqen_tests.jar
java -Djava.library.path=build -cp "$cp" FlipBench 1024 768 | tee "$tmp/flip.txt"
grep '^ratio ' "$tmp/flip.txt" > build-bench/bench/canvas.ratios

echo
echo "demo at 1024x768 (300 frames; draw = render, present = flip)"
java -Djava.library.path=build -cp build/java/pavoqen.jar Demo --headless --size 1024x768 --frames 300 \
    --out build-bench/demo_1024x768.png | grep -E 'frames in|layers'
java -Djava.library.path=build -cp build/java/pavoqen.jar Demo --window --size 1024x768 --frames 300 --fps 0 \
    | grep -E 'frames in|layers'
