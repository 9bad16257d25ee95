#!/usr/bin/env bash
# Runs every test executable of a Windows cross-build under wine, then `velatone.exe info`, and closes
# with the line 'N passed, N failed' (GoogleTest cases; a program that dies counts as one failure).
# The wine prefix lives in the build folder and is created on first use; no display is needed.
# Usage: scripts/wine-test.sh <build folder>
set -uo pipefail

if [ $# -ne 1 ] || [ ! -d "$1" ]; then
  echo "usage: $0 <build folder>" >&2
  exit 2
fi
build=$(cd "$1" && pwd)
source_dir=$(cd "$(dirname "$0")/.." && pwd)

export WINEPREFIX="$build/wineprefix"
export WINEARCH=win64
export WINEDEBUG=-all
# No Mono or Gecko installer offers while the prefix is made.
export WINEDLLOVERRIDES="mscoree,mshtml="
unset DISPLAY WAYLAND_DISPLAY
wine=$(command -v wine64 || command -v wine || true)
wineserver=$(command -v wineserver || true)
[ -z "$wineserver" ] && [ -x /usr/lib/wine/wineserver64 ] && wineserver=/usr/lib/wine/wineserver64
if [ -z "$wine" ] || [ -z "$wineserver" ]; then
  echo "wine-test: wine is not installed (scripts/deps.sh windows)" >&2
  exit 2
fi
# Per-program limit; a hung program counts as a failure instead of stalling CI.
limit=${VT_WINE_TEST_TIMEOUT:-600}

if [ ! -f "$WINEPREFIX/system.reg" ]; then
  echo "wine-test: creating $WINEPREFIX"
  "$wine" wineboot --init >/dev/null 2>&1
  "$wineserver" -w
fi
# One server for the whole run, ended with it.
"$wineserver" -p
trap '"$wineserver" -k >/dev/null 2>&1' EXIT

# Wine's drive Z: is the root of the build machine.
to_windows() { printf 'Z:%s' "${1//\//\\}"; }
export VT_TEST_DATA
VT_TEST_DATA=$(to_windows "$source_dir/tests/data")

logs="$build/wine-test-logs"
mkdir -p "$logs"
passed=0
failed=0
mapfile -t programs < <(find "$build" -path "$WINEPREFIX" -prune -o -name '*_tests.exe' -type f -print | sort)
if [ ${#programs[@]} -eq 0 ]; then
  echo "wine-test: no test programs under $build" >&2
  exit 1
fi

for program in "${programs[@]}"; do
  name=$(basename "$program" .exe)
  log="$logs/$name.log"
  (cd "$build" && timeout "$limit" "$wine" "$program" --gtest_brief=1) >"$log" 2>&1
  status=$?
  ok=$(sed -n 's/^\[  PASSED  \] \([0-9]*\) test.*/\1/p' "$log" | tail -1)
  bad=$(sed -n 's/^\[  FAILED  \] \([0-9]*\) test.*/\1/p' "$log" | tail -1)
  skipped=$(sed -n 's/^\[  SKIPPED \] \([0-9]*\) test.*/\1/p' "$log" | tail -1)
  ok=${ok:-0}
  bad=${bad:-0}
  if [ "$status" -ne 0 ] && [ "$bad" -eq 0 ]; then
    bad=1  # died, hung or failed outside any test
  fi
  passed=$((passed + ok))
  failed=$((failed + bad))
  printf '%-28s %4d passed, %d failed%s\n' "$name" "$ok" "$bad" "${skipped:+, $skipped skipped}"
  if [ "$bad" -ne 0 ]; then
    echo "---- $log (exit status $status)"
    tail -n 60 "$log"
    echo "----"
  fi
done

# The tool reads the module's property list from its PiPL resource and runs it under every host.
info_log="$logs/velatone-info.log"
if [ -f "$build/velatone.exe" ]; then
  (cd "$build" && timeout "$limit" "$wine" "$build/velatone.exe" info) >"$info_log" 2>&1
  status=$?
  if [ "$status" -eq 0 ] && grep -q '^effect property list: 12 properties' "$info_log"; then
    passed=$((passed + 1))
    printf '%-28s %4d passed, %d failed\n' "velatone info" 1 0
  else
    failed=$((failed + 1))
    printf '%-28s %4d passed, %d failed\n' "velatone info" 0 1
    tail -n 40 "$info_log"
  fi
fi

echo "$passed passed, $failed failed"
[ "$failed" -eq 0 ]
