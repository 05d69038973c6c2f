#!/bin/sh
# usage: run.sh <folder of the built fuzzers> <property> [<option of the engine>...]
set -eu
here=$(cd "$(dirname "$0")" && pwd)
built=$1 property=$2
shift 2
# Texts are read in the locale; corpora have characters beyond ASCII. The engine's schedule by
# entropy takes longer than most properties.
LC_ALL=${CFG32_FUZZ_LOCALE:-C.UTF-8} exec "$built/fuzz_$property" \
    -entropic=0 -max_len=600 -timeout=60 -rss_limit_mb=4096 -print_final_stats=1 \
    -dict="$here/dictionaries/$property.dict" -artifact_prefix="$built/broken/$property-" \
    "$@" "$built/found/$property" "$here/corpus/$property"
