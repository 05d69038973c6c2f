#!/bin/sh
# Configured with CFG32_PLATFORM=external, the library leaves the server's routines to the host.
# usage: external_platform_test.sh <cmake> <source folder> <scratch folder> <generator>
#            <C compiler> <C++ compiler> <client source> <routines source>
set -eu
cmake=$1 source=$2 scratch=$3 generator=$4 cc=$5 cxx=$6 client=$7 routines=$8
rm -rf "$scratch/run"
mkdir -p "$scratch/run/etc"
# The fastest build; the folder is kept, so that a second run builds what has changed.
"$cmake" -S "$source" -B "$scratch/build" -G "$generator" -DCFG32_PLATFORM=external \
    -DCFG32_TESTS=OFF -DCMAKE_BUILD_TYPE=None -DCMAKE_CXX_FLAGS=-O0 \
    -DCMAKE_C_COMPILER="$cc" -DCMAKE_CXX_COMPILER="$cxx" >"$scratch/run/configure.log"
"$cmake" --build "$scratch/build" --target cfg32 --parallel 2 >"$scratch/run/build.log"
library=$(find "$scratch/build" -name libcfg32.so)
test -n "$library"
folder=$(dirname "$library")

for routine in getNUVInstallPath nuv_snprintf initLocaleMutex set_locale_mutex copyFile \
    check_format format_password unformat_password _slapd_utils_decode_buffer_free; do
    nm -D --undefined-only "$library" | grep -q " $routine\$" || {
        echo "$routine is not left to the host" >&2
        exit 1
    }
done
if readelf -d "$library" | grep -q cfg32platform; then
    echo "the platform library is still needed" >&2
    exit 1
fi
test -z "$(find "$scratch/build" -name 'libcfg32platform.so*')"

cd "$scratch/run"
compile() {
    "$cc" -std=c99 -pedantic-errors -Wall -Wextra -Werror -D_GNU_SOURCE -I"$source/include" \
        "$@" -L"$folder" -Wl,-rpath,"$folder" -lcfg32
}
printf 'int cfg_count_values(char **);\nint main(void) { return cfg_count_values(0); }\n' >bare.c
if compile bare.c -o bare 2>bare.log; then
    echo "a program without the routines could be linked" >&2
    exit 1
fi
grep -q unformat_password bare.log

compile "$client" "$routines" -o client
cat >etc/oruslapd.conf <<'CONFIGURATION'
dn: cn=Configuration
objectclass: top
oru-slapdAdminDN: cn=root
oru-slapdAdminPW: secret
oru-slapdMasterPW: sesame
garbage
CONFIGURATION
./client "$PWD"
