#!/usr/bin/env bash
# Prints docs/formats.md: docs/formats/about.md, the command's table, and what else docs/formats/ tells of formats.
# Usage: tools/make_docs.sh COMMAND
set -euo pipefail
ingester=$(realpath "$1")
cd "$(dirname "$0")/../docs/formats"

echo '<!-- Made by `make docs` from docs/formats/ and the table of formats: change those. -->'
cat about.md
echo
"$ingester" formats --markdown
for prose in $(printf '%s\n' *.md | LC_ALL=C sort); do
    [[ $prose != about.md ]] || continue
    echo
    cat "$prose"
done
