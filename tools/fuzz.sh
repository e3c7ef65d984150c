#!/usr/bin/env bash
# Feeds a reader with hostile bytes and fails on a finding.
# Usage: tools/fuzz.sh READER [SECONDS] | --build | --list
# FUZZ_BUILT=1 says that the targets are built, so that several readers can run at a time.
set -euo pipefail
cd "$(dirname "$0")/.."

build_targets() {
    tools/set_up.sh build fuzz
    [[ -f build/fuzz/build.ninja ]] || cmake --preset fuzz
    cmake --build build/fuzz --target "$@"
}

case ${1:-} in
    --build) build_targets fuzz_readers; exit ;;
    --list) sed -n 's/^fuzz_[a-z]*(\([a-z0-9_]*\) .*/\1/p' fuzz/CMakeLists.txt; exit ;;
    '' | -*) sed -n '2,4s/^# //p' "$0" >&2; exit 2 ;;
esac

reader=$1
seconds=${2:-60}
if ! tools/fuzz.sh --list | grep -qx -- "$reader"; then
    echo "fuzz: no reader is called '$reader'; there are:" $(tools/fuzz.sh --list) >&2
    exit 2
fi
[[ -n ${FUZZ_BUILT:-} ]] || build_targets "fuzz_$reader"

corpus=build/fuzz/corpus/$reader
findings=build/fuzz/findings/$reader
mkdir -p "$corpus" "$findings"
folders=("$corpus")
[[ -d fuzz/seeds/$reader ]] && folders+=("fuzz/seeds/$reader")

# A reader's scratch files go with this folder, however the run ends.
TMPDIR=$(mktemp -d)
export TMPDIR
trap 'rm -rf "$TMPDIR"' EXIT

status=0
build/fuzz/fuzz/fuzz_"$reader" -max_total_time="$seconds" -rss_limit_mb=2048 -timeout=10 -max_len=65536 \
    -print_final_stats=1 -artifact_prefix="$findings/" "${folders[@]}" || status=$?
if ((status != 0)); then
    echo "fuzz: $reader has a finding; its input is in $findings" >&2
    exit 1
fi
echo "fuzz: $reader, $seconds seconds without a finding"
