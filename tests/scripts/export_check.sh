#!/bin/bash
# The library's dynamic symbols must be exactly the exports listed in
# tests/exports/*.txt (one symbol a line, '#' starts a comment).
set -euo pipefail
lib=$1; dir=$2
expected=$(cat "$dir"/*.txt | sed 's/#.*//' | tr -d ' \t' | grep -v '^$' | sort -u)
actual=$(nm -D --defined-only "$lib" | awk '{print $3}' | grep -v -E '^(_init|_fini|_edata|_end|__bss_start)$' | sort -u)
if [ "$expected" != "$actual" ]; then
  echo "export list differs (< expected, > actual):"
  diff <(echo "$expected") <(echo "$actual") || true
  exit 1
fi
echo "export check: $(echo "$actual" | wc -l) symbols match"
