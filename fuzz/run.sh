#!/usr/bin/env bash
# SPDX-License-Identifier: Apache-2.0
# Runs every fuzz target for its share of the time, each on a new copy of its seeds, and reports.
# usage: fuzz/run.sh SECONDS [BUILD_FOLDER]
#   SECONDS       in all, split evenly between the targets, at least one each; longer if a target needs
#                 more time for its minimum of 1,000 inputs
#   BUILD_FOLDER  holds the targets; build/fuzz unless given
# Exit status 1: a target found something, or ran too few inputs to mean anything.
set -euo pipefail
cd "$(dirname "$0")/.."

TARGETS=(inf_text image tuning options description tuning_text)
LEAST_EXECUTIONS=1000

if [ $# -lt 1 ] || [ $# -gt 2 ] || ! [[ $1 =~ ^[1-9][0-9]*$ ]]; then
    sed -n '4,7s/^# //p' "$0" >&2
    exit 2
fi
build=$(realpath "${2:-build/fuzz}")
share=$(($1 / ${#TARGETS[@]}))
[ "$share" -ge 1 ] || share=1

# Folder of the targets' units; a finding leaves its unit behind.
TMPDIR=$(mktemp -d -p "$([ -w /dev/shm ] && echo /dev/shm || echo "${TMPDIR:-/tmp}")" orvane-fuzz-run-XXXXXX)
export TMPDIR
trap 'rm -rf "$TMPDIR"' EXIT

# By target: the length from which inputs cost time and find nothing new; the words of its format.
options_of() {
    case $1 in
    inf_text) echo "-max_len=1024 -dict=fuzz/inf_text.dict" ;;
    image) echo "-max_len=5004" ;;
    tuning) echo "-max_len=1881" ;;
    options) echo "-max_len=160" ;;
    description) echo "-max_len=2048 -dict=fuzz/description.dict" ;;
    tuning_text) echo "-max_len=2048 -dict=fuzz/tuning_text.dict" ;;
    esac
}

# stat NAME LOG: a figure of libFuzzer's final statistics, 0 where the log has none.
stat() { awk -v name="stat::$1:" '$1 == name { value = $2 } END { print value + 0 }' "$2"; }

# what_happened LOG: the report of a sanitizer or of the target; else the last lines.
what_happened() {
    grep -a -B 1 -E '^expected:|^found: |ERROR: |runtime error:|what\(\):|^SUMMARY: ' "$1" |
        grep -a -v '^--' | cut -c 1-300 || tail -n 5 "$1"
}

# fuzz_until OPTION: runs the program until OPTION ends it, and sets `status`.
fuzz_until() {
    status=0
    "$program" "${options[@]}" "$1" -timeout=10 -print_final_stats=1 \
        -artifact_prefix="$prefix" "$corpus" >"$log" 2>&1 || status=$?
}

mkdir -p "$build/artifacts" "$build/corpus" "$build/log"
format='%-11s %12s %12s %12s %9s\n'
# shellcheck disable=SC2059 # the format is a constant
row() { printf "$format" "$@"; }

row target executions per-second new-inputs findings
failed=0
hints=()
for target in "${TARGETS[@]}"; do
    program=$build/orvane-fuzz-$target
    corpus=$build/corpus/$target
    log=$build/log/$target
    prefix=$build/artifacts/$target-
    rm -rf "$corpus" "$prefix"*
    cp -r "fuzz/corpus/$target" "$corpus"

    read -ra options <<<"$(options_of "$target")"
    fuzz_until -max_total_time="$share"
    executions=$(stat number_of_executed_units "$log")
    # A slow or busy machine may take longer.
    if [ "$status" -eq 0 ] && [ "$executions" -lt "$LEAST_EXECUTIONS" ]; then
        fuzz_until -runs="$LEAST_EXECUTIONS"
        executions=$(stat number_of_executed_units "$log")
    fi

    shopt -s nullglob
    artifacts=("$prefix"*)
    shopt -u nullglob
    findings=${#artifacts[@]}
    [ "$status" -eq 0 ] || [ "$findings" -gt 0 ] || findings=1
    row "$target" "$executions" "$(stat average_exec_per_sec "$log")" \
        "$(stat new_units_added "$log")" "$findings"

    if [ "$findings" -gt 0 ]; then
        failed=1
        hints+=("$target: exit status $status; full log in $log:" "$(what_happened "$log")")
        for artifact in "${artifacts[@]}"; do
            hints+=("again: $(printf '%q ' "$program" "$artifact")")
        done
    elif [ "$executions" -lt "$LEAST_EXECUTIONS" ]; then
        failed=1
        hints+=("$target: fewer than $LEAST_EXECUTIONS executions")
    fi
done
[ ${#hints[@]} -eq 0 ] || printf '%s\n' "" "${hints[@]}"
exit "$failed"
