#!/bin/sh
# What is installed serves a client that knows nothing but the package's name.
# usage: install_test.sh <cmake> <build folder> <C compiler> <scratch folder> <client source>
set -eu
cmake=$1 build=$2 compiler=$3 scratch=$4 client=$5
command -v pkg-config >/dev/null || exit 77
rm -rf "$scratch"
mkdir -p "$scratch"
prefix=$scratch/prefix
"$cmake" --install "$build" --prefix "$prefix" >"$scratch/install.log"

package=$(find "$prefix" -name cfg32.pc)
test -n "$package"
PKG_CONFIG_PATH=$(dirname "$package")
export PKG_CONFIG_PATH
package_config() {
    pkg-config "$@" cfg32
}
cd "$scratch"
printf 'dn: cn=Configuration\nobjectclass: top\n' >oruslapd.conf
# shellcheck disable=SC2046  # the options are separate words
"$compiler" -std=c99 -pedantic-errors -Wall -Wextra -Werror $(package_config --cflags) \
    "$client" -o client $(package_config --libs)
test "$(LD_LIBRARY_PATH=$(package_config --variable=libdir) ./client oruslapd.conf)" = Success
test "$(LD_LIBRARY_PATH=$(package_config --variable=libdir) ./client none)" = "Connection error"
test "$(pkg-config --modversion cfg32)" != ""
