#!/bin/sh
# cfg32.h and cfg32_platform.h compile alone, strictly, as C and C++, with every compiler there is;
# cfg32.h also together with an LDAP client's header, where there is one, and where it is to do
# without. usage: header_test.sh <include folder>
set -eu
include=$1
warnings="-pedantic-errors -Wall -Wextra -Werror -Wconversion -Wshadow -Wundef"
compiled=0

compile() { # <headers, in their order> <compiler> <language> <standard> [<option>...]
    headers=$1 compiler=$2 language=$3 standard=$4
    shift 4
    {
        # Twice: the second time they must be empty.
        for header in $headers $headers; do
            printf '#include <%s>\n' "$header"
        done
        printf 'extern int used;\nint used = 0;\n'
    } | "$compiler" -x "$language" "-std=$standard" $warnings "$@" -I"$include" -fsyntax-only - || {
        echo "$headers: $compiler -std=$standard $*" >&2
        exit 1
    }
    compiled=$((compiled + 1))
}

compile_all() { # <compiler> <language> <standard> [<option>...]
    command -v "$1" >/dev/null || return 0
    compile cfg32.h "$@"
    compile cfg32.h "$@" -DCFG32_WITHOUT_LDAP_H
    compile cfg32_platform.h "$@"
    if echo '#include <ldap.h>' | "$1" -x "$2" -fsyntax-only - 2>/dev/null; then
        compile "ldap.h cfg32.h" "$@"
        compile "ldap.h cfg32.h" "$@" -DCFG32_WITHOUT_LDAP_H
        compile "cfg32.h ldap.h" "$@"
    fi
}

for standard in c99 c11; do
    compile_all gcc c $standard -Wstrict-prototypes -Wmissing-prototypes -Wc++-compat
    compile_all clang c $standard -Wstrict-prototypes -Wmissing-prototypes
done
for standard in c++17 c++20; do
    compile_all g++ c++ $standard -Wnon-virtual-dtor
    compile_all clang++ c++ $standard
done
test "$compiled" -gt 0 || exit 77
echo "compiled $compiled times"
