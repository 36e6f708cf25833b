#!/usr/bin/env bash
# Installs a build into a temporary prefix, and builds and runs hosts against it, in C++ and in C: once
# found by CMake, once by pkg-config. Arguments: source directory, build directory, 1 if the wordcatcher
# command was built, compiler flags.
set -euo pipefail
source=$1 build=$2 with_cli=$3 flags=$4
work=$(mktemp -d)
trap 'rm -rf "$work"' EXIT
prefix=$work/prefix

cmake --install "$build" --prefix "$prefix" >/dev/null
# A moved tree must work as well: nothing in it may hold the place that it was installed to.
mv "$prefix" "$work/moved"
prefix=$work/moved
libdir=$(dirname "$(find "$prefix" -name libwordcatcher.so)")

# The commands find the library by themselves.
unset LD_LIBRARY_PATH
(cd "$source/tests/data" && "$prefix/bin/verify-metaphone") 2>"$work/verdicts" || {
  echo "the installed verify-metaphone ended with $?: $(tail -n 1 "$work/verdicts")" >&2
  exit 1
}
passes=$(grep -c '^pass: ' "$work/verdicts" || true)
if [ "$passes" -lt 600 ] || grep '^FAIL' "$work/verdicts" >&2; then
  echo "the installed verify-metaphone passed $passes words, or failed one" >&2
  exit 1
fi
echo "the installed verify-metaphone passes $passes words"
if [ "$with_cli" = 1 ]; then
  version=$("$prefix/bin/wordcatcher" --version)
  [ "$version" = "wordcatcher 1.0.0" ] || {
    echo "the installed wordcatcher printed: $version" >&2
    exit 1
  }
  echo "the installed wordcatcher works"
  for page in man/man1/wordcatcher.1 man/man1/wordcatcher-find.1 \
    bash-completion/completions/wordcatcher zsh/vendor-completions/_wordcatcher; do
    [ -s "$prefix/share/$page" ] || {
      echo "nothing was installed at share/$page" >&2
      exit 1
    }
  done
  echo "its pages and completions are there"
fi

export LD_LIBRARY_PATH=$libdir

expected=$'1.0.0\n{KXWordcatch v:"golden retriever", dist: 1}'
check() {
  mkdir "$work/$1"
  local output
  output=$("$2" "$work/$1/")
  [ "$output" = "$expected" ] || {
    echo "the host built by $1 printed: $output" >&2
    exit 1
  }
  echo "the host built by $1 works"
}

cmake -S "$source/examples/installed_host" -B "$work/host" -DCMAKE_PREFIX_PATH="$prefix" \
  -DCMAKE_CXX_FLAGS="$flags" --log-level=WARNING
cmake --build "$work/host" >/dev/null
check cmake "$work/host/host"

export PKG_CONFIG_PATH=$libdir/pkgconfig
# shellcheck disable=SC2046
g++ -std=c++20 $flags "$source/examples/installed_host/host.cpp" -o "$work/by_pkg_config" \
  $(pkg-config --cflags --libs wordcatcher)
check pkg-config "$work/by_pkg_config"

# A host in C: it reads the index that the last host in C++ built.
cc=${CC:-cc}
cmake -S "$source/examples/installed_c_host" -B "$work/c_host" -DCMAKE_PREFIX_PATH="$prefix" \
  -DCMAKE_C_COMPILER="$cc" -DCMAKE_C_FLAGS="$flags -Wall -Wextra -Wpedantic -Werror" --log-level=WARNING
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
