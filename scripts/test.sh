#!/usr/bin/env bash
# Installs what is missing, builds everything and runs the whole test suite headless.
#   scripts/test.sh [--sanitize] [ctest arguments]
# --sanitize builds into build-sanitize/ (or $ZUBASE_SANITIZE_BUILD_DIR) with AddressSanitizer
# and UndefinedBehaviorSanitizer and runs the suite there.
set -euo pipefail
root="$(cd "$(dirname "${BASH_SOURCE[0]}")/.." && pwd)"
"$root/scripts/install-deps.sh"

if [ "${1:-}" = "--sanitize" ]; then
    shift
    build="${ZUBASE_SANITIZE_BUILD_DIR:-$root/build-sanitize}"
    cmake -S "$root" -B "$build" -G Ninja -DCMAKE_BUILD_TYPE=RelWithDebInfo \
        -DZUBASE_SANITIZE=ON -DZUBASE_BUILD_BENCHMARKS=OFF >/dev/null
    cmake --build "$build" -j"${ZUBASE_JOBS:-2}"
    # PAM modules are loaded with dlopen; pam_unix needs libcrypt, which the sanitizer runtime
    # must see from the start.
    crypt="$(ldconfig -p | awk '/libcrypt\.so\.1 .*x86-64/ {print $NF; exit}')"
    export LD_PRELOAD="${crypt:+$crypt}"
    export ASAN_OPTIONS="detect_leaks=0:abort_on_error=1:detect_stack_use_after_return=1:verify_asan_link_order=0"
    export UBSAN_OPTIONS="print_stacktrace=1:halt_on_error=1"
else
    build="${ZUBASE_BUILD_DIR:-$root/build}"
    "$root/scripts/build.sh"
fi
cd "$build"
export QT_QPA_PLATFORM=offscreen
ctest --output-on-failure --timeout 600 "$@"
