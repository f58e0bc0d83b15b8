#!/usr/bin/env bash
# Configures and builds zubase into build/ (or $ZUBASE_BUILD_DIR); extra arguments go to the build.
set -euo pipefail
root="$(cd "$(dirname "${BASH_SOURCE[0]}")/.." && pwd)"
build="${ZUBASE_BUILD_DIR:-$root/build}"
cmake -S "$root" -B "$build" -G Ninja -DCMAKE_BUILD_TYPE="${CMAKE_BUILD_TYPE:-RelWithDebInfo}" >/dev/null
cmake --build "$build" -j"${ZUBASE_JOBS:-2}" "$@"
