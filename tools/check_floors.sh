#!/usr/bin/env bash
# Refuses an include from a lower floor of src/ to an upper one, a path that climbs with "..", and
# a header of the operating system outside platform/.
# Usage: tools/check_floors.sh [SOURCE_FOLDER]
set -euo pipefail
cd "${1:-src}"

find . -name '*.h' -o -name '*.cpp' | sed 's,^\./,,' | sort | xargs awk '
function floor_of(path)
{
    if (path ~ /^support\//) return 1
    if (path ~ /^platform\//) return 2
    if (path ~ /^request\//) return 3
    if (path ~ /^model\//) return 4
    if (path ~ /^(spreadsheet|hostfiles|statfiles|science)\//) return 5
    if (path ~ /^interface\//) return 6
    if (path ~ /^command\//) return 7
    return 0
}
function refuse(why) { printf "%s:%d: %s\n", FILENAME, FNR, why; bad = 1 }

FNR == 1 {
    here = floor_of(FILENAME)
    if (here == 0) refuse("stands on no floor that is known")
}
/^[ \t]*#[ \t]*include[ \t]*"/ {
    split($0, part, "\"")
    if (part[2] ~ /(^|\/)\.\.\//) refuse("include by a climbing path: " part[2])
    else if (floor_of(part[2]) > here) refuse("include of an upper floor: " part[2])
}
/^[ \t]*#[ \t]*include[ \t]*<(sys\/.*|unistd|fcntl|dirent|dlfcn|pwd|poll|spawn|windows|io|direct)(\.h)?>/ {
    if (FILENAME !~ /^platform\//) refuse("header of the operating system outside platform/: " $0)
}
END { exit bad }
'
