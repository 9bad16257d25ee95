#!/usr/bin/env bash
# The main job on a bundled default: grades the bundled image with the bundled grade through the
# module, as a host would, and prints where the result went.
set -eu
build=${1:-build}
here=$(cd "$(dirname "$0")/.." && pwd)
mkdir -p "$here/out"
args=()
while IFS= read -r line; do
  case "$line" in ''|'#'*) continue ;; esac
  args+=(--set "$line")
done < "$here/demo/grade.txt"
"$build/velatone" render "$here/demo/scene.png" "$here/out/scene-graded.png" "${args[@]}" \
  --save-settings "$here/out/scene-graded.settings"
echo "graded image: $here/out/scene-graded.png"
echo "settings record: $here/out/scene-graded.settings"
