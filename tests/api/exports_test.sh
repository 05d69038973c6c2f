#!/bin/sh
# The library exports the calls that cfg32.h declares and nothing else.
# usage: exports_test.sh <cfg32.h> <libcfg32.so>
set -eu
declared=$(sed -n 's/^CFG32_API .*[ *]\(cfg_[a-z0-9_]*\)(.*/\1/p' "$1" | LC_ALL=C sort)
# Without the name of the version itself, which is an absolute symbol.
exported=$(nm -D --defined-only "$2" | awk '$2 != "A" {print $3}' | sed 's/@.*//' | LC_ALL=C sort)
test -n "$declared"
test "$(echo "$declared" | wc -l)" = "$(grep -c '^CFG32_API ' "$1")"
if [ "$declared" != "$exported" ]; then
    printf 'declared:\n%s\nexported:\n%s\n' "$declared" "$exported" >&2
    exit 1
fi
echo "$declared"
