#!/bin/sh
# cfg32.h and cfg32_platform.h compile alone, strictly, as C and C++, with every compiler there is.
# usage: header_test.sh <include folder>
set -eu
include=$1
warnings="-pedantic-errors -Wall -Wextra -Werror -Wconversion -Wshadow -Wundef"
compiled=0

compile() { # <compiler> <language> <standard> [<option>...]
    compiler=$1 language=$2 standard=$3
    shift 3
    command -v "$compiler" >/dev/null || return 0
    for header in cfg32.h cfg32_platform.h; do
        # Twice: the second time it must be empty.
        printf '#include "%s"\n#include "%s"\nextern int used;\nint used = 0;\n' \
            "$header" "$header" |
            "$compiler" -x "$language" "-std=$standard" $warnings "$@" -I"$include" \
                -fsyntax-only - || {
            echo "$header: $compiler -std=$standard" >&2
            exit 1
        }
        compiled=$((compiled + 1))
    done
}

for standard in c99 c11; do
    compile gcc c $standard -Wstrict-prototypes -Wmissing-prototypes -Wc++-compat
    compile clang c $standard -Wstrict-prototypes -Wmissing-prototypes
done
for standard in c++17 c++20; do
    compile g++ c++ $standard -Wnon-virtual-dtor
    compile clang++ c++ $standard
done
test "$compiled" -gt 0 || exit 77
echo "compiled $compiled times"
