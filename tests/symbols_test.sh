#!/usr/bin/env bash
# Compares the C symbols of the shared library with the list in its version script, and the list
# with the header and with what the tests in C call. Arguments: shared library, version script, header,
# a test in C...
set -euo pipefail
export LC_ALL=C
library=$1 script=$2 header=$3
shift 3

# "name@@NODE" of each symbol that the list has.
listed=$(awk '/^[A-Z_0-9]+ \{/ { node = $1 } /^ +wordcatcher_[a-z_]+;$/ {
  sub(";", "", $1); print $1 "@@" node }' "$script" | sort)
[ -n "$listed" ] || { echo "$script lists nothing" >&2; exit 1; }

symbols=$(nm -D --defined-only --with-symbol-versions "$library" | awk '{ print $NF }')
exported=$(grep -E '^wordcatcher_' <<<"$symbols" | sort)
diff <(echo "$listed") <(echo "$exported") >&2 || {
  echo "$library (>) exports other C symbols than $script lists (<)" >&2
  exit 1
}

# What C++ exports has no version, and so stays as its compiler names it.
if versioned=$(grep '@' <<<"$symbols" | grep -vE '^wordcatcher_'); then
  echo "these have a version and are no C symbols: $versioned" >&2
  exit 1
fi

declared=$(grep -oE '\bwordcatcher_[a-z_]+\(' "$header" | tr -d '(' | sort -u)
diff <(sed 's/@@.*//' <<<"$listed") <(echo "$declared") >&2 || {
  echo "$header (>) declares other functions than $script lists (<)" >&2
  exit 1
}
called=$(cat "$@" | grep -oE '\bwordcatcher_[a-z_]+\(' | tr -d '(' | sort -u)
untried=$(comm -23 <(echo "$declared") <(echo "$called"))
[ -z "$untried" ] || {
  echo "no test in C calls" $untried >&2
  exit 1
}
echo "$(wc -l <<<"$exported") C symbols are as listed, and each is called"
