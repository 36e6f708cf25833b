#!/usr/bin/env bash
# The example of the page about C prints what the page says. Arguments: page, example.
set -euo pipefail
page=$1 example=$2
work=$(mktemp -d)
trap 'rm -rf "$work"' EXIT
promised=$(awk '/^```text$/ { inside = 1; next } /^```$/ { inside = 0 } inside' "$page")
[ -n "$promised" ] || { echo "$page promises nothing" >&2; exit 1; }
diff <(echo "$promised") <(cd "$work" && "$example")
