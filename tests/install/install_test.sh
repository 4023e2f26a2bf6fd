#!/bin/sh
# Installs the build into a fresh prefix, builds a C program against the installed copy with
# pkg-config, and runs it with the host stand-in linked in and the driver stand-in on the path.
# Arguments: build directory, source of the program, directory of libsvhost.so, of libkvor.so.1,
# and the compiler's sanitizer option of the build (empty when it has none).
set -eu
build=$1 program=$2 hostdir=$3 driverdir=$4 sanitize=${5:-}
prefix=$(mktemp -d)
trap 'rm -rf "$prefix"' EXIT
cmake --install "$build" --prefix "$prefix" >/dev/null
libdir=$(ls -d "$prefix"/lib*/ | head -n 1)
test -L "$libdir/libkvsvapi.so" && test -L "$libdir/libkvsvapi.so.1"
export PKG_CONFIG_PATH="$libdir/pkgconfig"
cc -std=c11 -Wall -Wextra -Werror $sanitize -o "$prefix/use_library" "$program" \
  $(pkg-config --cflags --libs kvsvapi) -L"$hostdir" -lsvhost -Wl,-rpath-link,"$driverdir" \
  -Wl,-rpath,"$libdir:$hostdir"
# The driver is the system's in production; here its stand-in is found through the path.
LD_LIBRARY_PATH="$driverdir" "$prefix/use_library"
