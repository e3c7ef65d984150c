#!/usr/bin/env bash
# Feeds a reader with hostile bytes and fails on a finding, or tells what its corpus reaches of some sources.
# Usage: tools/fuzz.sh READER [SECONDS] | --all [SECONDS] | --shares [SECONDS] | --build | --list
#        | --coverage READER [SOURCE...]
# --all feeds every reader and takes SECONDS (600) in total. --shares tells how it would share them out: most go to
# the readers whose own files changed since FUZZ_BASE, else since the branch left main, on main itself in the last 40
# steps. FUZZ_BUILT=1 says that the targets are built.
set -euo pipefail
cd "$(dirname "$0")/.."
steps_on_main=40
least_seconds=5

build_targets() {  # PRESET TARGET...
    local preset=$1
    tools/set_up.sh build fuzz
    [[ -f build/$preset/build.ninja ]] || cmake --preset "$preset"
    cmake --build "build/$preset" --target "${@:2}"
}

rows() {  # KIND NAME ARGUMENT...
    sed -n 's/^fuzz_\(reader\|function\)(\(.*\))$/\1 \2/p' fuzz/CMakeLists.txt
}

list_readers() {
    rows | cut -d ' ' -f 2
}

check_reader() {
    if ! list_readers | grep -qx -- "$1"; then
        echo "fuzz: no reader is called '$1'; there are:" $(list_readers) >&2
        exit 2
    fi
}

# The commit that changes are counted from; fails where the history doesn't tell.
find_base() {
    if [[ -n ${FUZZ_BASE:-} ]]; then
        git rev-parse -q --verify "$FUZZ_BASE^{commit}"
        return
    fi
    local main base
    for main in origin/main main; do
        base=$(git merge-base HEAD "$main" 2>/dev/null) || continue
        if [[ $base != $(git rev-parse HEAD) ]]; then
            echo "$base"
            return
        fi
    done
    git rev-parse -q --verify "HEAD~$steps_on_main^{commit}"
}

# The beginnings of the paths whose change changes the reader of a row.
own_paths() {  # KIND NAME ARGUMENT...
    if [[ $1 == function ]]; then
        printf 'src/%s\n' "${@:3}"
        echo "fuzz/try/$2.cpp"
    else
        echo "src/${3%/*}/"
        echo "fuzz/prepare/${5:-$2}.cpp"
    fi
}

# For each reader its name, and 1 if it changed.
tell_changed() {
    local base changed row path one
    if base=$(find_base); then
        changed=$(git diff --name-only "$base"; git ls-files --others --exclude-standard)
    else
        changed=$(git ls-files 2>/dev/null || find src fuzz -type f)
    fi
    while read -r -a row; do
        one=0
        while read -r path; do
            [[ $'\n'$changed != *$'\n'$path* ]] || one=1
        done < <(own_paths "${row[@]}")
        echo "${row[1]} $one"
    done < <(rows)
}

# Names and seconds, the longest first; together they take all processors for the seconds given.
share_seconds() {  # SECONDS
    tell_changed | awk -v total="$1" -v processors="$(nproc)" -v least="$least_seconds" '
        { name[NR] = $1; changed[NR] = $2; count += $2 }
        END {
            budget = total * processors
            even = budget / NR
            few = count == 0 || even < least ? even : least
            many = count == 0 ? even : (budget - (NR - count) * few) / count
            if (many > total) many = total
            for (i = 1; i <= NR; ++i) {
                seconds = int(changed[i] ? many : few)
                print name[i], (seconds > 1 ? seconds : 1)
            }
        }' | sort -k 2,2nr -s
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

feed_reader() {  # READER SECONDS
    find_corpus "$1"
    mkdir "$TMPDIR/$1"
    if ! TMPDIR=$TMPDIR/$1 build/instrumented/fuzz/fuzz_"$1" -max_total_time="$2" -rss_limit_mb=2048 -timeout=10 \
        -max_len=65536 -print_final_stats=1 -artifact_prefix="$findings/" "${folders[@]}"; then
        echo "fuzz: $1 has a finding; its input is in $findings" >&2
        return 1
    fi
    echo "fuzz: $1, $2 seconds without a finding"
}

# Of a reader without a finding one line is shown.
feed_quietly() {  # READER SECONDS
    local log=build/fuzz/log/$1.log
    if feed_reader "$1" "$2" >"$log" 2>&1; then
        tail -n 1 "$log"
    else
        tail -n 60 "$log"
        return 1
    fi
}

feed_all() {  # SECONDS
    mkdir -p build/fuzz/log
    export -f find_corpus feed_reader feed_quietly
    share_seconds "$1" | xargs -P "$(nproc)" -L 1 bash -c 'feed_quietly "$@"' fuzz
}

# A reader's scratch files go with this folder, however the run ends.
TMPDIR=$(mktemp -d)
export TMPDIR
trap 'rm -rf "$TMPDIR"' EXIT

case ${1:-} in
    --build) build_targets instrumented fuzz_readers; exit ;;
    --coverage) tell_coverage "${2:-}" "${@:3}"; exit ;;
    --list) list_readers; exit ;;
    --shares) share_seconds "${2:-600}"; exit ;;
    --all)
        [[ -n ${FUZZ_BUILT:-} ]] || build_targets instrumented fuzz_readers
        feed_all "${2:-600}"
        exit
        ;;
    '' | -*) sed -n '2,7s/^# //p' "$0" >&2; exit 2 ;;
esac

check_reader "$1"
[[ -n ${FUZZ_BUILT:-} ]] || build_targets instrumented "fuzz_$1"
feed_reader "$1" "${2:-60}"
