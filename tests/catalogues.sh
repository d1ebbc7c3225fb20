#!/bin/sh
# Makes catalogues with good and bad translations of one message, and runs the test that looks it up.
# Usage: catalogues.sh HOST_TEST
set -eu
command -v msgfmt >/dev/null || { echo "msgfmt is not installed"; exit 77; }
work=$(mktemp -d)
trap 'rm -rf "$work"' EXIT
long=$(printf '%01021d' 0)

# language, translation, what is to come of it where that is not the translation
while IFS='|' read -r language translation expected; do
  mkdir -p "$work/$language/LC_MESSAGES"
  printf 'msgid ""\nmsgstr "Content-Type: text/plain; charset=UTF-8\\n"\n\nmsgid "overflow %%s."\nmsgstr "%s"\n' \
    "$translation" | msgfmt -o "$work/$language/LC_MESSAGES/M.mo" -
  echo "$language ${expected:-$translation}" >>"$work/rows"
done <<ROWS
xa|zu gross %s
xb|%s: zu gross
xc|zu gross|overflow %s.
xd|%s und %s|overflow %s.
xe|zu gross %d|overflow %s.
xf|zu gross %n|overflow %s.
xg|%1\$s|overflow %s.
xh|%99999s|overflow %s.
xi|%s 100%|overflow %s.
xj|%ls|overflow %s.
xk|%% %s|overflow %s.
xl|$long%s
xm|0$long%s|overflow %s.
ROWS
CATALOGUES=$work "$1" --gtest_filter=Messages.OfBadCataloguesAreNotUsed | tee "$work/out"
grep -q '^\[  PASSED  \] 1 test' "$work/out"
