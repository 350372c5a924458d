#!/usr/bin/env bash
# The example as a user meets it: what it writes, where, and how it fails.
set -u
transcode=$1
dir=$(mktemp -d)
trap 'rm -rf "$dir"' EXIT
cd "$dir"
failures=0
# check NAME EXIT-CODE COMMAND...: runs the command, leaves its output in out and err
check() {
  local name=$1 expected=$2 code=0
  shift 2
  "$@" >out 2>err || code=$?
  [ $code = "$expected" ] || { echo "$name: exit code $code, not $expected: $(cat err)"; failures=$((failures + 1)); }
}
expect() { [ "$2" = "$3" ] || { echo "$1: '$2' is not '$3'"; failures=$((failures + 1)); }; }

text=$'z\u00e9\u20ac\U1f600\n'
printf '%s' "$text" >in
for encoding in utf-16le utf-16be; do
  iconv -f utf-8 -t $encoding in >wanted
  check "to $encoding" 0 "$transcode" --to $encoding in
  expect "to $encoding" "$(od -An -tx1 out)" "$(od -An -tx1 wanted)"
  check "from $encoding" 0 "$transcode" --from $encoding -o back wanted
  expect "from $encoding" "$(od -An -tx1 back)" "$(od -An -tx1 in)"
done
check "a stream" 0 "$transcode" - <in
expect "a stream" "$(cat out)" "$(cat in)"

echo old >kept
chmod 640 kept
printf 'ab\nc\303\251d\377z' >bad
check "malformed UTF-8" 1 "$transcode" -o kept bad
expect "malformed UTF-8" "$(cat err)" "transcode: bad: not well-formed utf-8 at byte 7 (line 2, column 4)"
printf 'a\0\0\334' >bad
check "malformed UTF-16" 1 "$transcode" -f utf-16le -o kept bad
expect "malformed UTF-16" "$(cat err)" "transcode: bad: not well-formed utf-16le at byte 2 (line 1, column 2)"
check "ascii" 1 "$transcode" -f ascii -o kept in
expect "what was there" "$(cat kept)" old
check "replacing" 0 "$transcode" -o kept in
expect "replacing" "$(cat kept) $(stat -c %a kept) $(ls | wc -l)" "$(cat in) 640 7"
check "a device" 0 "$transcode" -o /dev/null in
expect "a device" "$(stat -c %F /dev/null)" "character special file"
check "no such file" 1 "$transcode" missing
check "a full disk" 1 bash -c "'$transcode' in >/dev/full"
check "no such option" 2 "$transcode" --nonsense
check "no such encoding" 2 "$transcode" --to ebcdic
check "ascii output" 2 "$transcode" --to ascii
check "help" 0 "$transcode" --help
check "report" 0 "$transcode" --report in
expect "report" "$(grep -c -e 'code points  *5' -e 'same bytes' out)" 2
exit $((failures > 0))
