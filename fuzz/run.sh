#!/bin/sh
# usage: run.sh <folder of the built fuzzers> <property> <folder> [<option of the engine>...]
# What it finds of interest goes to the folder, and is where it goes on from; "new" is an empty one.
# A text for which the property does not hold goes to broken/ beside the fuzzers.
set -eu
here=$(cd "$(dirname "$0")" && pwd)
built=$1 property=$2 found=$3
shift 3
if [ "$found" = new ]; then
    found=$(mktemp -d)
    trap 'rm -rf "$found"' EXIT
fi
mkdir -p "$found" "$built/broken"
# Texts are read in the locale; corpora have characters beyond ASCII. The engine's schedule by
# entropy takes longer than most properties.
LC_ALL=${CFG32_FUZZ_LOCALE:-C.UTF-8} "$built/fuzz_$property" \
    -entropic=0 -max_len=600 -timeout=60 -rss_limit_mb=4096 -print_final_stats=1 \
    -dict="$here/dictionaries/$property.dict" -artifact_prefix="$built/broken/$property-" \
    "$@" "$found" "$here/corpus/$property"
