#!/bin/sh
# Counts the instructions one painted cell costs under callgrind (deterministic, unlike wall
# time on a shared machine): ZuTabstopItemDelegate with a tab pattern, the same delegate
# without one (the proxy only), and a plain QItemDelegate, on the same 10,000-row model.
# Each mode runs with 0 and N cells; the difference divided by N is the cost of one cell.
# Usage: bench/run_tabstopdelegate_callgrind.sh [build-dir] [cells]
set -eu
BUILD_DIR=${1:-build}
CELLS=${2:-10000}
BENCH="$BUILD_DIR/bench/bench_tabstopdelegate"
[ -x "$BENCH" ] || { echo "no $BENCH; build the target bench_tabstopdelegate first" >&2; exit 2; }
command -v valgrind >/dev/null || { echo "valgrind is not installed" >&2; exit 2; }
export QT_QPA_PLATFORM=offscreen
WORK=$(mktemp -d)
trap 'rm -rf "$WORK"' EXIT

instructions() {
    out="$WORK/$1-$2.out"
    valgrind --tool=callgrind --callgrind-out-file="$out" "$BENCH" "$1" "$2" \
        >/dev/null 2>"$WORK/$1-$2.log"
    awk '/^totals:/ { print $2 }' "$out"
}

per_cell() {
    zero=$(instructions "$1" 0)
    many=$(instructions "$1" "$CELLS")
    awk -v a="$zero" -v b="$many" -v n="$CELLS" 'BEGIN { printf "%.0f", (b - a) / n }'
}

plain=$(per_cell plain)
proxy=$(per_cell proxy)
tabstop=$(per_cell tabstop)
echo "instructions per painted cell ($CELLS cells, callgrind):"
echo "  QItemDelegate                          $plain"
echo "  ZuTabstopItemDelegate, no pattern      $proxy"
echo "  ZuTabstopItemDelegate, tab stops       $tabstop"
awk -v p="$plain" -v x="$proxy" -v t="$tabstop" 'BEGIN {
    printf "ratio without pattern  %.3f\n", x / p
    printf "ratio with tab stops   %.3f  (goal <= 1.5)\n", t / p }'

echo
for mode in plain tabstop; do "$BENCH" "$mode" "$CELLS" 2>/dev/null; done
