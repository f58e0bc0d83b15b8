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
COUNT=$CELLS
. "$(dirname "$0")/callgrind_common.sh"

per_cell() { per_unit %.0f "$1"; }

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
