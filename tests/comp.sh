#!/bin/sh
# Runs the comp example as a user does: its samples, its languages, and files that cannot be used.
# Usage: comp.sh PROGRAM SOURCE_FOLDER
set -eu
program=$1
samples=$2/comp/samples
tests=$2/tests
work=$(mktemp -d)
trap 'rm -rf "$work"' EXIT

fail() {
  echo "$*"
  exit 1
}

sheets() {
  LC_ALL=C "$program" "$@" "$samples/space.json" "$tests/comp_odd.json"
}
# Of layers that differ in their numbers only one is enough here.
sheets | sed '2,/^Frame/{/^Frame/!d}; /^Layer "\(Edge\|Behind\|Empty\|Halved\|Too long\)"/,/^$/d' >"$work/sheets"
diff "$tests/comp_sheets.txt" "$work/sheets" || fail "< the sheets as they should be, > as they are"
# The same as JSON, here with a line for each layer, and with numbers from the platform's sine rounded.
sheets --json | tr -d '\n' | perl -pe 's/ +/ /g; s/\{ "name"/\n$&/g;
  s/-?\d+\.\d{5,}(e-?\d+)?|-?\d+(\.\d+)?e-\d+/sprintf("%.4f", sprintf("%.4f", $&) + 0)/ge' >"$work/json"
diff "$tests/comp_json.txt" "$work/json" || fail "< the JSON as it should be, > as it is"
"$program" --help >"$work/help" && grep -q '^Usage: comp' "$work/help" || fail "--help does not help"
row='"Harbour at dawn",1,clip,"Net",1751/250,12009/1000,1001/1000,7007/2000,1/2,1,00:00:07:00,00:00:12:00'
"$program" --csv "$samples/harbour.otio" | grep -qxF "$row" || fail "no $row"
"$program" --json "$samples/harbour.otio" - <"$samples/harbour.otio" | grep -c '"timelines"' | grep -qx 1 || fail "timelines are not one document"

# Pictures, with their numbers in whole pixels.
draw() {
  "$program" --svg "$work/picture" "$@" 2>/dev/null
  perl -pe 's/-?\d+\.\d+/sprintf("%.0f", $&)/ge' "$work/picture"
}
draw --hit 960,540 --grid 3 "$samples/space.json" >"$work/pictures"
diff "$tests/comp_pictures.txt" "$work/pictures" || fail "< the pictures as they should be, > as they are"

status=0
"$program" "$samples/film.json" >/dev/full 2>"$work/err" || status=$?
[ "$status" = 1 ] && grep -q 'cannot be written' "$work/err" || fail "exit status $status where nothing can be written"
status=0
"$program" --svg "$work/no/picture" "$samples/stage.json" >"$work/out" 2>"$work/err" || status=$?
[ "$status" = 1 ] && grep -q 'picture cannot be written' "$work/err" || fail "exit status $status where nothing can be drawn"

# Where decimals have a comma, machines still read points.
if localedef -i de_DE -f UTF-8 "$work/de_DE.UTF-8" 2>/dev/null; then
  env -u LC_ALL LANG=C LC_NUMERIC=de_DE.UTF-8 LOCPATH="$work" "$program" --svg "$work/german" "$samples/space.json" 2>/dev/null
  LC_ALL=C "$program" --svg "$work/plain" "$samples/space.json" 2>/dev/null
  cmp "$work/german" "$work/plain" || fail "a picture follows the locale"
fi

# EDIT of the base file, what its sheet then says.
says() {
  sed "$1" "$tests/comp_base.json" >"$work/edited.json"
  LC_ALL=C "$program" --overlaps "$work/edited.json" | grep -q "$2" || fail "no '$2' with $1"
}
says 's/24/"30000\/1001"/; s/"start": 0/"start": 2147483647/' '^  seen from  *~.* ~71654371.034 ±0.02  *2147483647 '
says 's/24/"30000\/1001"/; s/"start": 0/"start": 2147483647/' 'multiply\.$'
says 's/24/24, "size": [100, 100]/; s/"in": 0/"in": 0, "size": [400, 40], "position": [60, 50, -100], "orientation": {"angles": [0, 90, 0]}/' '^  cut at  *(10, -20, 0.1) (10, 20, 0.1)$'
says 's/24/24, "size": [9, 9], "camera": {"eye": [1, 2, 3], "target": [4, 6, 15], "up": [3, 1, -2]}/; s/"in": 0/"in": 0, "size": [1, 1], "position": [1, 2, 3]/' '^  from the eye  *(-0.232, 0.611, -0.269) (-0.654, -0.265, -0.038)'
says 's/24/24, "size": [9, 9]/; s/"in": 0/"in": 0, "size": [2, 3], "anchor": [0, 0], "position": [0, 0], "scale": [2, 3]/' 'placed by scale$'
says 's/24/24, "size": [9, 9]/; s/"in": 0/"in": 0, "size": [4, 4], "position": [-9, -9]/; s/{"name": "L".*}\]/&/; 2s/ *\({.*}\)\]/\1, \1]/' '^  over "L"  *-11,-11 to -7,-7$'
says 's/24/24, "size": [9, 9]/; s/"in": 0/"in": 0, "size": [1, 1], "position": [1, 2, 3], "keys": [{"frame": 0, "quaternion": [0, 0, 0, 2]}, {"frame": 4, "quaternion": [0, 0, 1, 0]}]/' '^  frame 2  *(0, 0, 53.13)$'
says 's/"start": 0/"start": "00:01:00:00"/' '^  start  *1440/24  *60.000000  *1440  *00:01:00:00$'
says 's/24/24, "size": [30000, 1]/' '^Frame 30000 x 1,'
says 's/24/24, "size": [16, 9]/; s/"in": 0/"in": 0, "size": [1, 1], "position": [1, 2, 3]/' '^Space, seen from (8, 4.5, -16) towards (8, 4.5, 0), zoom 16$'
says '1s/$/]}/; 2d' '^  All times are exact.$'

# What cannot be used: exit status 2, one sentence, nothing printed.
refuse() {
  sentence=$1
  shift
  status=0
  "$program" "$@" >"$work/out" 2>"$work/err" || status=$?
  [ "$status" = 2 ] || fail "exit status $status for $*: $sentence"
  [ ! -s "$work/out" ] || fail "something was printed for $*"
  printf 'comp: %s\n' "$sentence" | cmp -s - "$work/err" || fail "got:      $(cat "$work/err")
expected: comp: $sentence"
}
refuse "$work/none.json: cannot be read." "$work/none.json"
refuse "$samples/film.json: composition has no \"size\" to be drawn in." --svg "$work/picture" "$samples/film.json"
while read -r sentence; do
  read -r words
  # shellcheck disable=SC2086
  refuse "$sentence; see comp --help." $words
done <<END
FILE is required

The following argument was not expected: -f
-f $samples/film.json
--svg: 1 required TEXT missing
$samples/stage.json --svg
--svg: At Most 1 required but received 2
--svg $work/a --svg $work/b $samples/stage.json
--svg draws one file
--svg $work/picture $samples/stage.json $samples/space.json
--hit: At Most 2 required but received 3
--svg $work/picture --hit 5,6,7 $samples/stage.json
--time: 1x is not a number
--svg $work/picture --time 1x $samples/stage.json
--time: inf is not a number
--svg $work/picture --time inf $samples/stage.json
--grid: Value 1001 not in range 1 to 1000
--svg $work/picture --grid 1001 $samples/stage.json
--grid requires --svg
--grid 4 $samples/stage.json
END
while IFS='|' read -r edit sentence; do
  sed "$edit" "$tests/comp_base.json" >"$work/bad.json"
  refuse "$work/bad.json: $sentence" "$samples/film.json" "$work/bad.json"
done <"$tests/comp_errors.txt"
length=$(wc -c <"$tests/comp_base.json")
while [ "$length" -gt 5 ]; do
  length=$((length - 5))
  head -c "$length" "$tests/comp_base.json" >"$work/cut.json"
  status=0
  "$program" "$work/cut.json" >"$work/out" 2>"$work/err" || status=$?
  [ "$status" = 2 ] && [ ! -s "$work/out" ] && grep -q "ends too soon (line [12], column [0-9]*)\.$" "$work/err" ||
    fail "exit status $status, cut at $length"
done

# Without memory there is a sentence, whatever is being made.
if [ "${ASAN_OPTIONS-}${TSAN_OPTIONS-}" = "" ]; then
  python3 -c 'print("[" + "1," * 20000000)' >"$work/large"
  status=0
  (ulimit -v 100000 && LC_ALL=C "$program" "$work/large") 2>"$work/err" || status=$?
  [ "$status" = 1 ] && grep -qx 'comp: There is not enough memory.' "$work/err" || fail "exit status $status without memory"
fi

# A terminal gets colours, unless its user does not want any; a folder is no file, and names move no cursor.
on_terminal() {
  python3 -c 'import pty, sys; pty.spawn(sys.argv[1:])' "$program" "$samples/harbour.otio" | tr '\033' E
}
on_terminal | grep -q '^E\[1mTimeline ' || fail "a terminal gets no colours"
NO_COLOR=1 on_terminal | grep -q '^Timeline ' || fail "NO_COLOR is not followed"
refuse "$work: cannot be read." "$work"
printf '{"OTIO_SCHEMA": "Clip.1", "name": "a\\u001b[2J\\u009b\\u202e<b>"}' >"$work/evil.otio"
"$program" "$work/evil.otio" | grep -qF 'clip       a?[2J??<b>' || fail "a name does what it likes"
refuse "$(printf 'none\357\277\275?: cannot be read.')" "$(printf 'none\377\033')"

# Needs the catalogues, which are there where msgfmt was.
says_in() {
  LC_ALL=C.UTF-8 LANGUAGE=$1 "$program" "$samples/sound.json" >"$work/out"
  grep -qF "[0x110010] $2 (" "$work/out" && [ "$(grep -c 'All times' "$work/out")" = "$3" ] || fail "no message in language $1"
}
says_in xx 'overflow in ratio addition.' 1
if command -v msgfmt >/dev/null; then
  xgettext --c++ --keyword=Tr --keyword=Later --from-code=UTF-8 -o "$work/comp.pot" "$2"/comp/*.cpp
  for language in de fr ja; do msgcmp "$2/comp/po/$language.po" "$work/comp.pot" || fail "not all is said in $language"; done
  says_in de 'Überlauf bei der Addition von Verhältnissen.' 0
  says_in fr 'dépassement dans une addition de rapports.' 0
  says_in ja 'オーバーフロー: 比の加算。' 0
fi
