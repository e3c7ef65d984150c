#!/usr/bin/env bash
# Feeds a reader with hostile bytes and fails on a finding, or tells what its corpus reaches of some sources.
# Usage: tools/fuzz.sh READER [SECONDS] | --build | --list | --coverage READER [SOURCE...]
# FUZZ_BUILT=1 says that the targets are built, so that several readers can run at a time.
set -euo pipefail
cd "$(dirname "$0")/.."

build_targets() {  # PRESET TARGET...
    local preset=$1
    tools/set_up.sh build fuzz
    [[ -f build/$preset/build.ninja ]] || cmake --preset "$preset"
    cmake --build "build/$preset" --target "${@:2}"
}

check_reader() {
    if ! tools/fuzz.sh --list | grep -qx -- "$1"; then
        echo "fuzz: no reader is called '$1'; there are:" $(tools/fuzz.sh --list) >&2
        exit 2
    fi
}

# The inputs kept by earlier runs, and the seeds; and the place for those that fail.
find_corpus() {
    folders=("build/fuzz/corpus/$1")
    findings=build/fuzz/findings/$1
    mkdir -p "${folders[0]}" "$findings"
    [[ ! -d fuzz/seeds/$1 ]] || folders+=("fuzz/seeds/$1")
}

tell_coverage() {  # READER [SOURCE...]
    check_reader "$1"
    find_corpus "$1"
    tools/set_up.sh coverage
    build_targets fuzz-coverage "fuzz_$1"
    local program=build/fuzz-coverage/fuzz/fuzz_$1 profile=build/fuzz-coverage/$1
    if ! LLVM_PROFILE_FILE=$profile.raw "$program" -runs=0 -artifact_prefix="$findings/" "${folders[@]}" \
        2>"$profile.log"; then
        tail -n 40 "$profile.log" >&2
        exit 1
    fi
    llvm-profdata merge -o "$profile.profile" "$profile.raw"
    llvm-cov report "$program" -instr-profile="$profile.profile" "${@:2}"
}

# A reader's scratch files go with this folder, however the run ends.
TMPDIR=$(mktemp -d)
export TMPDIR
trap 'rm -rf "$TMPDIR"' EXIT

case ${1:-} in
    --build) build_targets fuzz fuzz_readers; exit ;;
    --coverage) tell_coverage "${2:-}" "${@:3}"; exit ;;
    --list) sed -n 's/^fuzz_[a-z]*(\([a-z0-9_]*\) .*/\1/p' fuzz/CMakeLists.txt; exit ;;
    '' | -*) sed -n '2,4s/^# //p' "$0" >&2; exit 2 ;;
esac

reader=$1
seconds=${2:-60}
check_reader "$reader"
[[ -n ${FUZZ_BUILT:-} ]] || build_targets fuzz "fuzz_$reader"

find_corpus "$reader"

status=0
build/fuzz/fuzz/fuzz_"$reader" -max_total_time="$seconds" -rss_limit_mb=2048 -timeout=10 -max_len=65536 \
    -print_final_stats=1 -artifact_prefix="$findings/" "${folders[@]}" || status=$?
if ((status != 0)); then
    echo "fuzz: $reader has a finding; its input is in $findings" >&2
    exit 1
fi
echo "fuzz: $reader, $seconds seconds without a finding"
