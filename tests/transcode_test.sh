#!/usr/bin/env bash
# The example as a user meets it: what it writes, where, and how it fails.
set -u
transcode=$1
sources=$(cd "$(dirname "$0")/../examples/transcode" && pwd)
dir=$(mktemp -d)
trap 'rm -rf "$dir"' EXIT
cd "$dir" || exit 1
failures=0
fail() { echo "$*"; failures=$((failures + 1)); }
# check NAME EXIT-CODE COMMAND...: runs the command, leaves its output in out and err
check() {
  local name=$1 expected=$2 code=0
  shift 2
  "$@" >out 2>err || code=$?
  [ $code = "$expected" ] || fail "$name: exit code $code, not $expected: $(cat err)"
}
expect() { [ "$2" = "$3" ] || fail "$1: '$2' is not '$3'"; }
same() { cmp -s "$2" "$3" || fail "$1: $2 and $3 differ"; }

# The sequences recur every 10 bytes, in UTF-8 and in UTF-16. The ends of a few blocks fall everywhere in them, at odd
# places when the first byte comes by itself.
printf '\357\273\277z\303\251\342\202\254\360\237\230\200\n' >in
{ cat in; yes "$(tail -c +4 in)" | tr -d '\n' | head -c 500000; cat in; } >long
encodings='utf-8 utf-16le utf-16be'
for to in $encodings; do iconv -f utf-8 -t $to long >long.$to; done
for from in $encodings; do
  for to in $encodings; do
    check "$from to $to" 0 "$transcode" --from $from --to $to long.$from
    same "$from to $to" out long.$to
    check "$from to $to, a stream" 0 "$transcode" -f $from -t $to - \
      < <(head -c 1 long.$from; sleep 0.05; tail -c +2 long.$from)
    same "$from to $to, a stream" out long.$to
  done
  check "report" 0 "$transcode" --report -f $from long.$from
  expect "report" "$(tr -s ' \n' ' ' <out)" "long.$from, $from: bytes $(stat -c %s long.$from) UTF-8 code units 500028 \
UTF-16 code units 250014 code points 200012 lines 2 longest line 200005 ASCII code points 25 % way back same bytes "
done
yes 'GET /' | head -c 200000 >ascii
check "from ascii" 0 "$transcode" -f ascii -t utf-16be ascii
same "from ascii" out <(iconv -f ascii -t utf-16be ascii)

# Faults before, at and behind the end of a block: the text before is printed, and the fault and its place named.
while read -r encoding width fault reason; do
  for bytes in 2 65528 65530 65532 65533 65534 65535 65536 65537 65538 131070 131072; do
    [ $((bytes % width)) = 0 ] || continue
    units=$((bytes / width))
    { echo; head -c $((units - 1)) /dev/zero | tr '\0' x; } | iconv -f ascii -t "$encoding" >before
    { cat before; printf "$fault"; } >bad
    place="byte $bytes (line 2, column $units)"
    check "$fault" 1 "$transcode" -f "$encoding" -t "${encoding/ascii/utf-8}" bad
    same "$fault at $bytes" out before
    expect "$fault" "$(cat err)" "transcode: bad: $reason at $place"
    check "$fault, check" 1 "$transcode" -f "$encoding" --check bad
    expect "$fault, check" "$(cat out err)" "transcode: bad: $reason at $place"
    check "$fault, replace" 0 "$transcode" -f "$encoding" --replace bad
    expect "$fault, replace" "$(grep -c ' malformed sequences\? replaced,.* at '"${place/(/.}" err)" 1
    cmp -s <(head -c $units out; printf '\357\277\275') <(head -c $((units + 3)) out) || fail "$fault: not replaced"
  done
done <<'ROWS'
utf-8 1 \377x invalid byte
utf-8 1 \342\202x truncated sequence
utf-8 1 \355\240\200 surrogate in UTF-8
utf-8 1 \360\237\230 truncated sequence
utf-8 1 \300\257 overlong sequence
utf-16le 2 \75\330x\0 unpaired surrogate
utf-16le 2 \0\334 unpaired surrogate
utf-16be 2 \330\75 unpaired surrogate
utf-16be 2 \0 truncated sequence
ascii 1 \303\251 byte above 7F
ROWS

# A million mutated lines, replaced as Python does.
python3 - >mutated <<'PYTHON'
import random, sys
random.seed(1)
pieces = [s.encode() for s in ("a", "é", "€", "\U0001F600")] * 3 + [
    b"\xC0\xAF", b"\xE0\x9F\xBF", b"\xED\xA0\x80", b"\xF0\x8F\xBF", b"\xF4\x90\x80", b"\xE2\x82", b"\xF1\x80\x80", b"\x80"]
for _ in range(1000000):
    line = bytearray(b"".join(random.choices(pieces, k=4)))
    line[random.randrange(len(line))] = random.randrange(11, 256)
    sys.stdout.buffer.write(line + b"\n")
PYTHON
check "mutated" 0 "$transcode" --replace mutated
python3 -c 'import sys
sys.stdout.buffer.write(open("mutated", "rb").read().decode("utf-8", "replace").encode())' >replaced
same "mutated" out replaced
check "mutated, to utf-16le" 0 "$transcode" --replace -t utf-16le mutated
same "mutated, to utf-16le" out <(iconv -f utf-8 -t utf-16le replaced)
check "well-formed" 0 "$transcode" --check long
expect "well-formed" "$(cat out err)" ""
check "replaced" 0 "$transcode" --replace long
expect "replaced" "$(cat err)" ""

echo old >kept
chmod 640 kept
check "malformed late" 1 "$transcode" -f ascii -t utf-16le -o kept bad
check "interrupted" 124 timeout 0.3 "$transcode" -o kept - < <(cat long; sleep 1)
check "what is added to" 1 timeout 5 bash -c "'$transcode' kept >>kept"
expect "what was there" "$(cat kept)" old
check "replacing" 0 "$transcode" -o kept in
ln -s new link
check "malformed, by a dangling link" 1 "$transcode" -f ascii -o link bad
check "a dangling link" 0 "$transcode" -o link in
expect "what is there" "$(cat kept new) $(stat -c %a kept) $(readlink link) $(ls | grep -c -e kept -e new)" \
  "$(cat in in) 640 new 2"
check "a device" 0 "$transcode" -o /dev/null in
expect "a device" "$(stat -c %F /dev/null)" "character special file"
check "no such file" 1 "$transcode" missing
check "a full disk" 1 bash -c "'$transcode' in >/dev/full"
check "no such option" 2 "$transcode" --nonsense
check "no name" 2 "$transcode" -o '' in
ln -s loop2 loop1; ln -s loop1 loop2
check "a loop of links" 1 "$transcode" -o loop1 in
check "no such encoding" 2 "$transcode" --to ebcdic
check "ascii output" 2 "$transcode" --to ascii
check "check and output" 2 "$transcode" --check -o kept in

# The sanitizers reserve more than any limit lets them.
if bash -c "ulimit -v 32000; '$transcode' --help; exit" >/dev/null 2>&1; then
  for options in '-t utf-16be' --report; do
    check "little memory" 0 bash -c "ulimit -v 32000; head -c 200000000 /dev/zero | '$transcode' $options | wc -c"
    [ "$(cat out)" -gt 100 ] || fail "little memory: $(cat out err)"
  done
fi

# What a terminal gets to see, carriage returns as bars and without the blanks that cover what was there.
while read -r name wanted command; do
  seen=$(transcode="$transcode -t utf-8" script -qec "$command" /dev/null </dev/null | tr '\r' '|' | tr -d ' \n')
  [[ $seen =~ ^$wanted$ ]] || fail "on a terminal, $name: '$seen' is not '$wanted'"
done <<'ROWS'
percent (\|\|transcode:[0-9]+%)+\|\| $transcode long | { sleep 1; cat >copy; }
bytes (\|\|transcode:[0-9.]+MB)+\|\| { cat in; sleep 1; cat long; } | $transcode -o copy
fault (\|\|transcode:.*MB)+\|\|transcode:-:truncated.*\| { cat in; sleep 1; cat long; head -c 1 in; } | $transcode -o copy
text G\|G\| { echo G; sleep 1; echo G; } | $transcode
short () $transcode -o copy in
quiet G\|G\| { echo G; sleep 1; echo G; } | $transcode -q -o copy; cat copy
ROWS

# The options are the same wherever they are listed, and bash completes them, encodings and files.
"$transcode" --help | grep -o -e '--[a-z]*' | sort -u >options
for place in transcode.bash _transcode transcode.1; do
  expect "options of $place" "$(sed 's/\\-/-/g' "$sources/$place" | grep -o -e '--[a-z]\+' | sort -u)" "$(cat options)"
done
printf '%s\n' 'transcode() { printf "<%s>" "$@"; echo; }' "source '$sources/transcode.bash'" \
  $'transcode --fr\tasc\t -t utf-16l\t --to=utf-16b\t -q\t -o kep\t kep\t' exit | bash --norc -i >out 2>/dev/null
expect completion "$(grep '^<' out)" '<--from><ascii><-t><utf-16le><--to=utf-16be><-q><-o><kept><kept>'
exit $((failures > 0))
