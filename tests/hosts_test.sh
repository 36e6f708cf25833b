#!/usr/bin/env bash
# Builds hosts in C++ and in C against an installed prefix and runs them: once found by CMake, once by
# pkg-config. Whatever else is installed or built is not used. Arguments: source directory, prefix,
# version, compiler flags.
set -euo pipefail
source=$1 prefix=$2 version=$3 flags=$4
work=$(mktemp -d)
trap 'rm -rf "$work"' EXIT
libdir=$(dirname "$(find "$prefix" -name libwordcatcher.so)")

unset CPATH C_INCLUDE_PATH CPLUS_INCLUDE_PATH LIBRARY_PATH PKG_CONFIG_PATH CMAKE_PREFIX_PATH
export LD_LIBRARY_PATH=$libdir

# of_prefix WHAT FILE...: every path of Wordcatcher in the files is one below the prefix.
of_prefix() {
  local what=$1 other
  shift
  other=$(grep -ohE '/[^ ]*(/wordcatcher/[^ ]*\.h|/cmake/wordcatcher|/libwordcatcher\.so[^ ]*)' "$@" |
    grep -v "^$prefix/") || [ $? -eq 1 ]
  [ -z "$other" ] || {
    echo "$what uses $other" >&2
    exit 1
  }
}

expected=$version$'\n{KXWordcatch v:"golden retriever", dist: 1}'
check() {
  mkdir "$work/$1"
  local output
  output=$("$2" "$work/$1/")
  [ "$output" = "$expected" ] || {
    echo "the host built by $1 printed: $output" >&2
    exit 1
  }
  ldd "$2" >"$work/loaded"
  grep -q libwordcatcher "$work/loaded"
  of_prefix "the host built by $1" "$work/loaded"
  echo "the host built by $1 works"
}

# build EXAMPLE: with CMake, in a directory named after it.
build() {
  cmake -S "$source/examples/$1" -B "$work/$1" -DCMAKE_PREFIX_PATH="$prefix" \
    -DCMAKE_CXX_FLAGS="$flags" >/dev/null
  of_prefix "what CMake finds for $1" "$work/$1/CMakeCache.txt"
  cmake --build "$work/$1" >/dev/null
}

build installed_host
check cmake "$work/installed_host/host"

# The example of a tutorial: finding by spelling, and by sound.
build names_register
printf '%s\t%s\n' 'Catherine Schmidt' 4711 'Stephen Phillips' 4712 >"$work/register"
output=$("$work/names_register/names_register" "$work/register" "$work" \
  <<<$'Cathrine Schmit\nSteven Philips\nJon Smith')
[ "$output" = $'Cathrine Schmit\tspelt\tCatherine Schmidt\t4711
Steven Philips\tsounds\tStephen Phillips\t4712' ] || {
  echo "the register of names printed: $output" >&2
  exit 1
}
ldd "$work/names_register/names_register" >"$work/loaded"
of_prefix "the register of names" "$work/loaded"
echo "the register of names works"

export PKG_CONFIG_LIBDIR=$libdir/pkgconfig
# shellcheck disable=SC2046
g++ -std=c++20 $flags "$source/examples/installed_host/host.cpp" -o "$work/by_pkg_config" \
  -MD -MF "$work/read" $(pkg-config --cflags --libs wordcatcher)
of_prefix "what pkg-config finds" "$work/read"
check pkg-config "$work/by_pkg_config"

# A host in C: it reads the index that the last host in C++ built.
cc=${CC:-cc}
cmake -S "$source/examples/installed_c_host" -B "$work/c_host" -DCMAKE_PREFIX_PATH="$prefix" \
  -DCMAKE_C_COMPILER="$cc" -DCMAKE_C_FLAGS="$flags -Wall -Wextra -Wpedantic -Werror" >/dev/null
of_prefix "what CMake finds for C" "$work/c_host/CMakeCache.txt"
cmake --build "$work/c_host" >/dev/null
# shellcheck disable=SC2046
"$cc" -std=c99 -Wall -Wextra -Wpedantic -Werror $flags \
  "$source/examples/installed_c_host/host.c" -o "$work/c_by_pkg_config" \
  $(pkg-config --cflags --libs wordcatcher)
for host in "$work/c_host/host" "$work/c_by_pkg_config"; do
  output=$("$host" "$work/pkg-config/" <<<"My goldn retriver barks")
  [ "$output" = $'6\tgolden retriever\tgoldn retriver' ] || {
    echo "the host in C printed: $output" >&2
    exit 1
  }
  if "$host" "$work/nowhere.wci" </dev/null 2>"$work/complaint"; then
    echo "the host in C found an index where there is none" >&2
    exit 1
  fi
  grep -q "There is no index at $work/nowhere.wci" "$work/complaint"
done
echo "the hosts in C work"

# Every public header stands on its own.
find "$prefix/include" -name '*.h' | while read -r header; do
  echo "#include \"${header#"$prefix/include/"}\"" |
    g++ -std=c++20 -Wall -Wextra -Wpedantic -Werror -fsyntax-only -I"$prefix/include" -x c++ -
done
echo "every installed header compiles by itself"
echo '#include <wordcatcher/wordcatcher.h>' |
  "$cc" -std=c99 -Wall -Wextra -Wpedantic -Werror -fsyntax-only -I"$prefix/include" -x c -
echo "the C header compiles as C"
