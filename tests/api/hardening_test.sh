#!/bin/sh
# The built files have the protections that the compiler and the linker were asked for.
# usage: hardening_test.sh <file>...
set -eu
export LC_ALL=C
for file in "$@"; do
    tell() {
        echo "$file: $1" >&2
        exit 1
    }
    headers=$(readelf --program-headers --wide "$file")
    dynamic=$(readelf --dynamic --wide "$file")
    names=$(nm -D --undefined-only "$file")
    readelf --file-header "$file" | grep -q 'Type: *DYN' || tell "has a fixed address"
    echo "$headers" | grep -q '^ *GNU_STACK .* RW ' || tell "has a stack that can be executed"
    echo "$headers" | grep -q '^ *GNU_RELRO' || tell "has a table of addresses that can be written"
    echo "$dynamic" | grep -q 'BIND_NOW' || tell "looks names up while it runs"
    if echo "$dynamic" | grep -q 'TEXTREL'; then
        tell "has code that can be written"
    fi
    echo "$names" | grep -q '__stack_chk_fail' || tell "does not look after its stack"
    echo "$names" | grep -q '_chk$\|_chk@' || tell "does not look at the sizes of buffers"
    # The mark of the whole file is missing where the C library's start files have none.
    objdump --disassemble "$file" | grep 'endbr64' >/dev/null || tell "can be made to jump anywhere"
done
