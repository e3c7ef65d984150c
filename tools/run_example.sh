#!/usr/bin/env bash
# Converts examples/crops.csv to each format that a table can be shown from, and shows it.
# Usage: tools/run_example.sh COMMAND
set -euo pipefail
ingester=${1:-build/release/ingester}
input=examples/crops.csv
folder=$(mktemp -d)
trap 'rm -rf "$folder"' EXIT

echo
echo "== Input: $input"
cat "$input"

script=$folder/crops.gen
echo
echo "== ingester $input crops.gen: the script that the host runs"
"$ingester" "$input" "$script"
cat "$script"

for format in tab; do
    output=$folder/crops.$format
    echo
    echo "== ingester $input crops.$format"
    status=0
    "$ingester" "$input" "$output" || status=$?
    echo "status $status"
    ((status == 0)) || exit "$status"

    echo
    echo "== Output: crops.$format ($(wc -c <"$output") bytes), read again and shown as comma text"
    "$ingester" "$output" - | tr -d '\r'
done
