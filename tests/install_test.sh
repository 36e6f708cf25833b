#!/usr/bin/env bash
# Installs a build into a temporary prefix, runs its commands, and builds hosts against it. Arguments:
# source directory, build directory, version, 1 if the wordcatcher command was built, compiler flags.
set -euo pipefail
source=$1 build=$2 expected=$3 with_cli=$4 flags=$5
work=$(mktemp -d)
trap 'rm -rf "$work"' EXIT
prefix=$work/prefix

cmake --install "$build" --prefix "$prefix" >/dev/null
# A moved tree must work as well: nothing in it may hold the place that it was installed to.
mv "$prefix" "$work/moved"
prefix=$work/moved

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
  [ "$version" = "wordcatcher $expected" ] || {
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

"$source/tests/hosts_test.sh" "$source" "$prefix" "$expected" "$flags"
