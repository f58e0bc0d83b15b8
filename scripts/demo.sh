#!/usr/bin/env bash
# Installs what is missing, builds the demo host and runs it. Without a display it renders its
# window offscreen and prints where the PNG went. Arguments go to the demo host (try --help).
set -euo pipefail
root="$(cd "$(dirname "${BASH_SOURCE[0]}")/.." && pwd)"
"$root/scripts/install-deps.sh"
"$root/scripts/build.sh" --target zudemo
exec "${ZUBASE_BUILD_DIR:-$root/build}/src/apps/zudemo/zudemo" "$@"
