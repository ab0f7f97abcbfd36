#!/bin/bash
# Runs the JUnit classes tagged "window" against real X servers: Xvfb
# instances that this script starts (-displayfd picks a free display, so
# parallel runs do not collide) and stops by their PIDs.
#   1. Xvfb with MIT-SHM                          -Dpavoqen.test.expect=shm
#   2. Xvfb -extension MIT-SHM (no extension)     -Dpavoqen.test.expect=plain
#   3. Xvfb in an IPC namespace of its own: it offers MIT-SHM but cannot
#      attach the client's segments, so the attach is refused
#                                                 -Dpavoqen.test.expect=plain
#      (left out, with a note, where unshare --ipc is not permitted)
# On the first server the demo client also runs in its window: the test card
# must appear on the screen (read with xwd + netpbm; the screenshot is kept as
# <library dir>/demo_window.png) and the demo must finish cleanly.
# Fails when a test fails, when the JVM reports JNI misuse, or when no test ran.
#   run_window_tests.sh <java> <junit console jar> <test jar> <product jar> <library dir>
set -uo pipefail
java=$1; console=$2; testjar=$3; productjar=$4; libdir=$5; shift 5

tmp=$(mktemp -d)
XVFB_PID=
cleanup() {
    if [ -n "$XVFB_PID" ]; then kill "$XVFB_PID" 2>/dev/null; wait "$XVFB_PID" 2>/dev/null; fi
    rm -rf "$tmp"
}
trap cleanup EXIT

# start_xvfb [wrapper...] -- [Xvfb options...]: sets DISPLAY and XVFB_PID.
start_xvfb() {
    local wrapper=() opts=()
    while [ $# -gt 0 ] && [ "$1" != -- ]; do wrapper+=("$1"); shift; done
    [ $# -gt 0 ] && shift
    opts=("$@")
    local out=$tmp/display
    rm -f "$out"
    "${wrapper[@]}" Xvfb -displayfd 9 -screen 0 1280x1024x24 -nolisten tcp "${opts[@]}" \
        9>"$out" >"$tmp/xvfb.log" 2>&1 &
    XVFB_PID=$!
    for _ in $(seq 200); do
        if grep -q '^[0-9]' "$out" 2>/dev/null; then
            DISPLAY=":$(head -1 "$out" | tr -d '[:space:]')"
            return 0
        fi
        kill -0 "$XVFB_PID" 2>/dev/null || break
        sleep 0.05
    done
    echo "window tests: Xvfb did not start" >&2
    cat "$tmp/xvfb.log" >&2
    return 1
}

stop_xvfb() {
    kill "$XVFB_PID" 2>/dev/null
    wait "$XVFB_PID" 2>/dev/null
    XVFB_PID=
}

failed=0
run() {  # run <label> <expect>
    local label=$1 expect=$2 log=$tmp/junit.log
    echo "=== window tests: $label (display $DISPLAY, expect $expect)"
    DISPLAY=$DISPLAY timeout 300 "$java" -Xcheck:jni -Djava.library.path="$libdir" \
        -Dpavoqen.test.expect="$expect" \
        -jar "$console" --disable-banner --details=tree --disable-ansi-colors \
        --class-path "$testjar:$productjar" --scan-class-path="$testjar" --include-tag=window \
        >"$log" 2>&1
    local status=$?
    cat "$log"
    local patterns='in native method|JNI call made|Calling other JNI functions in the scope of|JNI local refs|JNI critical'
    if grep -E -i -q "$patterns" "$log"; then
        echo "window tests ($label): JNI warnings in the output" >&2
        failed=1
    fi
    if [ $status -ne 0 ]; then
        echo "window tests ($label): JUnit exited with status $status" >&2
        failed=1
    elif ! grep -q -E '\[ +[1-9][0-9]* tests successful' "$log" || ! grep -q -E '\[ +0 tests skipped' "$log"; then
        echo "window tests ($label): tests were skipped or none ran" >&2
        failed=1
    fi
}

# Pixel (x, y) of a PNM file as "R G B".
pixel() {
    pamcut -left "$2" -top "$3" -width 1 -height 1 "$1" | pnmtoplainpnm | tail -n +4 \
        | tr -s ' \n' ' ' | sed 's/^ //; s/ $//'
}

demo_window() {
    local log=$tmp/demo.log
    echo "=== window tests: demo client in a window (display $DISPLAY)"
    DISPLAY=$DISPLAY timeout 120 "$java" -Djava.library.path="$libdir" -cp "$productjar" Demo --window \
        --size 800x600 --frames 300 --fps 60 >"$log" 2>&1 &
    local pid=$! seen=0
    # The window sits at the screen's top-left (no window manager). Bars 0, 1,
    # 5 and 6 of the test card: white, yellow, red, blue.
    local shot=$tmp/screen.pnm
    for _ in $(seq 50); do
        sleep 0.2
        DISPLAY=$DISPLAY xwd -root -silent 2>/dev/null | xwdtopnm >"$shot" 2>/dev/null || continue
        if [ "$(pixel "$shot" 50 90)" = "255 255 255" ] && [ "$(pixel "$shot" 150 90)" = "255 255 0" ] &&
           [ "$(pixel "$shot" 550 90)" = "255 0 0" ] && [ "$(pixel "$shot" 650 90)" = "0 0 255" ]; then
            seen=1
            pnmtopng "$shot" >"$libdir/demo_window.png" 2>/dev/null
            break
        fi
        kill -0 "$pid" 2>/dev/null || break
    done
    wait "$pid"
    local status=$?
    cat "$log"
    if [ $seen -ne 1 ]; then
        echo "window tests (demo): the test card never appeared on the screen" >&2
        failed=1
    elif [ $status -ne 0 ] || ! grep -q 'frames in' "$log"; then
        echo "window tests (demo): the demo failed (status $status)" >&2
        failed=1
    else
        echo "window tests (demo): test card on screen, screenshot $libdir/demo_window.png"
    fi
}

start_xvfb -- || exit 1
run "MIT-SHM" shm
demo_window
stop_xvfb

start_xvfb -- -extension MIT-SHM || exit 1
run "no MIT-SHM" plain
stop_xvfb

if unshare --ipc true 2>/dev/null; then
    start_xvfb unshare --ipc -- || exit 1
    run "MIT-SHM attach refused" plain
    stop_xvfb
else
    echo "=== window tests: refused-attach run left out (unshare --ipc not permitted here)"
fi

[ $failed -eq 0 ] || exit 1
echo "window tests: all runs passed"
