#!/bin/sh
# install_host.sh SOURCE_DIR BUILD_DIR SCRATCH CMAKE CXX VERSION ABI: installs into SCRATCH, compares the installed
# files with installed_files.txt, builds and runs the example host against the installed library, once found by
# find_package and once by pkg-config, and a plug-in with a program that loads it.
set -eu
source_dir=$1 build_dir=$2 scratch=$3 cmake=$4 cxx=$5 version=$6 abi=$7
here=$source_dir/tests/install
prefix=$scratch/prefix

rm -rf "$scratch"
mkdir -p "$scratch"
tell_failure() {
    status=$?
    [ "$status" -eq 0 ] || { echo "install_host.sh: failed, the logs:" >&2; cat "$scratch"/*.log >&2; }
    exit "$status"
}
trap tell_failure EXIT
"$cmake" --install "$build_dir" --prefix "$prefix" >"$scratch/install.log"

# One list serves every library folder (lib, lib64, lib/TRIPLE), version and build type.
package_file=$(find "$prefix" -name lumenkey.pc)
libdir=${package_file#"$prefix"/}
libdir=${libdir%/pkgconfig/lumenkey.pc}
(cd "$prefix" && find . ! -type d | sed 's|^\./||') |
    sed -e "s|^$libdir/|LIBDIR/|" -e "s|\.so\.$version\$|.so.VERSION|" -e "s|\.so\.$abi\$|.so.ABI|" \
        -e 's|lumenkeyTargets-[a-z]*\.cmake|lumenkeyTargets-TYPE.cmake|' |
    LC_ALL=C sort >"$scratch/installed_files.txt"
if ! diff -u "$here/installed_files.txt" "$scratch/installed_files.txt"; then
    echo "The installed files are not those of tests/install/installed_files.txt. If that is meant:" >&2
    echo "  cp $scratch/installed_files.txt $here/installed_files.txt" >&2
    exit 1
fi

"$cmake" -S "$here/host" -B "$scratch/by_cmake" -G Ninja -DCMAKE_BUILD_TYPE=Release \
    -DCMAKE_PREFIX_PATH="$prefix" -DCMAKE_CXX_COMPILER="$cxx" \
    -DHOST_SOURCE="$source_dir/examples/channel_host.cpp" -DWANTED_VERSION="$version" >"$scratch/by_cmake.log"
"$cmake" --build "$scratch/by_cmake" >>"$scratch/by_cmake.log"
"$scratch/by_cmake/host" >"$scratch/by_cmake.out"

# A plug-in whose classes override the library's.
"$cmake" -S "$here/plugin" -B "$scratch/plugin" -G Ninja -DCMAKE_BUILD_TYPE=Release \
    -DCMAKE_PREFIX_PATH="$prefix" -DCMAKE_CXX_COMPILER="$cxx" -DWANTED_VERSION="$version" >"$scratch/plugin.log"
"$cmake" --build "$scratch/plugin" >>"$scratch/plugin.log"
"$scratch/plugin/plugin_host" "$scratch/plugin/plugin.so" >>"$scratch/plugin.log" 2>&1

export PKG_CONFIG_PATH="$prefix/$libdir/pkgconfig"
[ "$(pkg-config --modversion lumenkey)" = "$version" ]
# The flags are words to be split.
# shellcheck disable=SC2046
"$cxx" -std=c++20 -Wall -Wextra -Werror $(pkg-config --cflags lumenkey) "$source_dir/examples/channel_host.cpp" \
    -o "$scratch/by_pkgconfig" $(pkg-config --libs lumenkey) -Wl,-rpath,"$prefix/$libdir"
"$scratch/by_pkgconfig" >"$scratch/by_pkgconfig.out"

[ -s "$scratch/by_cmake.out" ]
cmp "$scratch/by_cmake.out" "$scratch/by_pkgconfig.out"

# The installed program finds the installed library.
if [ -e "$prefix/bin/lumenkey" ]; then
    "$prefix/bin/lumenkey" --help >/dev/null
    ldd "$prefix/bin/lumenkey" | grep -q "$prefix/.*liblumenkey"
fi
