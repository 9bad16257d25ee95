#!/usr/bin/env bash
# The main job on a bundled default: shows what a host sees of the built module.
set -eu
build=${1:-build}
"$build/velatone" info
