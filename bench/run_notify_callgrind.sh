#!/bin/sh
# Counts the instructions ZuApplication::notify costs per event under callgrind (deterministic,
# unlike wall time on a shared machine) and prints the ratios against a plain QApplication.
# Each configuration runs with 0 and with N events; the difference divided by N is the cost of
# one event. Usage: bench/run_notify_callgrind.sh [build-dir] [events]
set -eu
BUILD_DIR=${1:-build}
EVENTS=${2:-1000000}
BENCH="$BUILD_DIR/bench/bench_notify"
COUNT=$EVENTS
. "$(dirname "$0")/callgrind_common.sh"

per_event() { per_unit %.1f dispatch "$1"; }

plain=$(per_event plain)
zu=$(per_event zu)
hooks=$(per_event zuhooks)
echo "instructions per event ($EVENTS events, callgrind):"
echo "  QApplication                  $plain"
echo "  ZuApplication, no hooks       $zu"
echo "  ZuApplication, 3 no-op hooks  $hooks"
awk -v p="$plain" -v z="$zu" -v h="$hooks" 'BEGIN {
    printf "ratio without hooks  %.3f  (goal <= 1.05)\n", z / p
    printf "ratio with 3 hooks   %.3f  (goal <= 1.20)\n", h / p }'

# Wall time, for information only.
wall() { "$BENCH" dispatch "$1" "$EVENTS" 2>/dev/null | awk '{ print $NF }'; }
wp=$(wall plain); wz=$(wall zu); wh=$(wall zuhooks)
awk -v p="$wp" -v z="$wz" -v h="$wh" 'BEGIN {
    printf "wall time ns/event (information): plain %.1f  no hooks %.1f (%.2fx)  hooks %.1f (%.2fx)\n",
        p, z, z / p, h, h / p }'

echo
"$BENCH" deferred 2>/dev/null
