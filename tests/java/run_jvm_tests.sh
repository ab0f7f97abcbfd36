#!/bin/bash
# Runs every JUnit 5 test class of the test jar in one JVM with -Xcheck:jni.
# Fails when a test fails or when the JVM reports any JNI misuse, which
# -Xcheck:jni prints as a warning without failing the call.
#   run_jvm_tests.sh <java> <junit console jar> <test jar> <product jar> <library dir> <exports dir>
#                    [extra launcher args, e.g. --select-class=BridgeTest]
set -uo pipefail
java=$1; console=$2; testjar=$3; productjar=$4; libdir=$5; exports=$6; shift 6
[ $# -eq 0 ] && set -- --scan-class-path="$testjar"
log=$(mktemp)
trap 'rm -f "$log"' EXIT

"$java" -Xcheck:jni -Djava.awt.headless=true -Djava.library.path="$libdir" \
    -Dpavoqen.exports="$exports" \
    -jar "$console" --disable-banner --details=tree --disable-ansi-colors \
    --class-path "$testjar:$productjar" "$@" >"$log" 2>&1
status=$?
cat "$log"

# HotSpot's -Xcheck:jni diagnostics (the MXCSR one: native code returned to
# Java with its SSE control word changed).
patterns='in native method|JNI call made|Calling other JNI functions in the scope of|JNI local refs|JNI critical|changed by native JNI code'
if grep -E -i -q "$patterns" "$log"; then
    echo "jvm_tests: JNI warnings in the output:" >&2
    grep -E -i "$patterns" "$log" >&2
    exit 1
fi
if [ $status -ne 0 ]; then
    echo "jvm_tests: JUnit exited with status $status" >&2
    exit $status
fi
if ! grep -q -E '[1-9][0-9]* tests successful' "$log"; then
    echo "jvm_tests: no test ran" >&2
    exit 1
fi
exit 0
