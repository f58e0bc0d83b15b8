# Shared by the run_*_callgrind.sh scripts, sourced once BENCH names the benchmark program and
# COUNT the number of units (events, cells) to measure. Instructions are counted under callgrind,
# which is deterministic, unlike wall time on a shared machine.
command -v valgrind >/dev/null || { echo "valgrind is not installed" >&2; exit 2; }
[ -x "$BENCH" ] || { echo "no $BENCH; build the target $(basename "$BENCH") first" >&2; exit 2; }
export QT_QPA_PLATFORM=offscreen
WORK=$(mktemp -d)
trap 'rm -rf "$WORK"' EXIT

# Total instructions of one run of "$BENCH" with these arguments (the "totals:" line callgrind
# writes at the end of its file).
instructions() {
    out="$WORK/$(echo "$*" | tr ' /' '__').out"
    valgrind --tool=callgrind --callgrind-out-file="$out" "$BENCH" "$@" >/dev/null 2>"$out.log"
    awk '/^totals:/ { print $2 }' "$out"
}

# The cost of one unit: the run with COUNT units minus the run with none, divided by COUNT.
# per_unit <printf format> <arguments before the count>...
per_unit() {
    format=$1
    shift
    zero=$(instructions "$@" 0)
    many=$(instructions "$@" "$COUNT")
    awk -v a="$zero" -v b="$many" -v n="$COUNT" -v f="$format" 'BEGIN { printf f, (b - a) / n }'
}
