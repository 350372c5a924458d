#!/usr/bin/env bash
# Tests the example as users run it: what it writes, where, and how it fails.
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

# The sequences recur every 10 bytes, in UTF-8 and in UTF-16, so the ends of a few blocks fall at every even place in
# them, and at every odd place if the first byte arrives alone.
printf '\357\273\277z\303\251\342\202\254\360\237\230\200\n' >in
{ cat in; yes "$(tail -c +4 in)" | tr -d '\n' | head -c 500000; cat in; } >long
encodings='utf-8 utf-16le utf-16be utf-32le utf-32be'
for to in $encodings; do iconv -f utf-8 -t $to long >long.$to; done
for encoding in $encodings; do
  check "from $encoding" 0 "$transcode" --from $encoding long.$encoding
  same "from $encoding" out long
  check "from $encoding, a stream" 0 "$transcode" -f $encoding -t utf-16be - \
    < <(head -c 1 long.$encoding; sleep 0.05; tail -c +2 long.$encoding)
  same "from $encoding, a stream" out long.utf-16be
  check "to $encoding" 0 "$transcode" -f utf-16le --to $encoding long.utf-16le
  same "to $encoding" out long.$encoding
  check "report" 0 "$transcode" --report -f $encoding long.$encoding
  expect "report" "$(tr -s ' \n' ' ' <out)" "long.$encoding, $encoding: bytes $(stat -c %s long.$encoding) \
UTF-8 code units 500028 UTF-16 code units 250014 code points 200012 lines 2 longest line 200005 \
ASCII code points 25 % round trip same bytes "
done

# Faults before, at and past the end of a block: the text before a fault is printed, and the fault and its place are
# named. Three more runs take all files: one checks them, one replaces the faults (R), and one drops them.
while read -r encoding width fault replaced reason; do
  bad=() messages=
  : >wanted
  for bytes in 4 65528 65530 65532 65533 65534 65535 65536 65537 65538 131070 131072; do
    [ $((bytes % width)) = 0 ] || continue
    units=$((bytes / width))
    { echo; head -c $((units - 1)) /dev/zero | tr '\0' x; } >ascii
    iconv -f ascii -t "$encoding" ascii >before
    { cat before; printf "$fault"; } >bad.$bytes
    message="transcode: bad.$bytes: $reason at byte $bytes (line 2, column $units)"
    check "$fault" 1 "$transcode" -f "$encoding" -t "$encoding" bad.$bytes
    same "$fault at $bytes" out before
    expect "$fault" "$(cat err)" "$message"
    bad+=(bad.$bytes) messages+="$message"$'\n'
    { cat ascii; printf %s "$replaced"; } >>wanted
  done
  check "$fault, check" 1 "$transcode" -f "$encoding" --check "${bad[@]}"
  expect "$fault, check" "$(cat out err)" "${messages%?}"
  for how in --replace,replaced,$'\357\277\275' -c,dropped,; do
    IFS=, read -r option word character <<<"$how"
    check "$fault, $word" 0 "$transcode" -f "$encoding" $option "${bad[@]}"
    same "$fault, $word" out <(sed "s/R/$character/g" wanted)
    expect "$fault, $word" "$(sed "s/: .* $word, .*at byte/ at byte/; s/transcode: //" err)" \
      "$(sed "s/: .* at byte/ at byte/; s/transcode: //" <<<"${messages%?}")"
  done
done <<'ROWS'
utf-8 1 \377x Rx invalid byte
utf-8 1 \342\202x Rx truncated sequence
utf-8 1 \355\240\200 RRR surrogate in UTF-8
utf-8 1 \360\237\230 R truncated sequence
utf-8 1 \300\257 RR overlong sequence
utf-16le 2 \75\330x\0 Rx unpaired surrogate
utf-16le 2 \0\334 R unpaired surrogate
utf-16be 2 \330\75 R unpaired surrogate
utf-16be 2 \0 R truncated sequence
utf-32le 4 \0\330\0\0 R surrogate in UTF-32
utf-32be 4 \0\21\0\0\0\0\0x Rx code point above U+10FFFF
utf-32be 4 \0\0\0 R truncated sequence
ascii 1 \303\251 RR byte above 7F
ROWS

# Mutated lines, whose faults Python replaces and drops in the same way.
python3 - <<'PYTHON'
import random
random.seed(1)
pieces = [s.encode() for s in ("a", "é", "€", "\U0001F600")] * 3 + [
    b"\xC0\xAF", b"\xE0\x9F\xBF", b"\xED\xA0\x80", b"\xF0\x8F\xBF", b"\xF4\x90\x80", b"\xE2\x82", b"\xF1\x80\x80", b"\x80"]
def line():
    line = bytearray(b"".join(random.choices(pieces, k=4)))
    line[random.randrange(len(line))] = random.randrange(11, 256)
    return line + b"\n"
mutated = b"".join(line() for _ in range(200000))
open("mutated", "wb").write(mutated)
for how, option in ("replace", "--replace"), ("ignore", "-c"):
    for encoding in "utf-8", "utf-16le", "latin1":
        open(f"{option} -t {encoding}", "wb").write(mutated.decode("utf-8", how).encode(encoding, how))
PYTHON
for options in {--replace,-c}' -t '{utf-8,utf-16le,latin1}; do
  check "mutated, $options" 0 "$transcode" $options mutated
  same "mutated, $options" out ./"$options"
done
iconv -f latin1 -t utf-8 mutated >latin1
check "from latin1" 0 "$transcode" -f latin1 mutated
same "from latin1" out latin1
check "to latin1" 0 "$transcode" -t latin1 latin1
same "to latin1" out mutated

# The lines recur every 15 bytes. A block is one byte longer than a multiple of 15, so its ends fall at every place.
yes $'a\r\n\r\r\nb\n\n\rc\rd\r' | head -c 1200000 >lines
echo >>lines
for ends in 'lf s/\r$//' 'crlf s/\r\?$/\r/'; do
  check "line ends" 0 "$transcode" --line-endings "${ends% *}" lines
  same "line ends, $ends" out <(sed "${ends#* }" lines)
done

# Exit code, options, the bytes of up to three files, the bytes of the output, and the messages.
while IFS='|' read -r code options input expected message; do
  IFS=+ read -ra files <<<"$input"
  for i in 0 1 2; do printf "${files[i]-}" >file$i; done
  check "$options $input" "$code" "$transcode" $options file0 file1 file2
  expect "$options $input" "$(od -An -v -tx1 out | tr -d ' \n')" "$expected"
  expect "$options $input" "$(sed 's/transcode: file.: //' err | paste -sd ' ')" "$message"
done <<'ROWS'
0|-f utf-16|\377\376x\0|78|
0|-f UTF_16|\376\377\0x|78|
0|-f utf16//|\0x|78|
0|-f utf-32|\377\376\0\0x\0\0\0|78|
0|-f utf-32|\0\0\0x|78|
1|-f utf-16|x||truncated sequence at byte 0 (line 1, column 1)
0|-t utf-16|x|fffe7800|
0|-t utf-16|\357\273\277x|fffe7800|
0|-t utf-32|x|fffe000078000000|
0|-t utf-16le|\357\273\277x|fffe7800|
0|-t utf-16 --bom=strip|x|0078|
0|-f utf-16 -t utf-16 --bom=keep|\0x|0078|
0|-f utf-16 --bom=keep|\377\376x\0|efbbbf78|
0|-f utf-16|\377\376x\0+\376\377\0y|7879|
0|-t ISO-8859-1|\357\273\277\303\277|ff|
0||\357\273\277x+\357\273\277y|efbbbf7879|
0|--bom=strip|\357\273\277x|78|
0|--bom=add|x+\357\273\277y+\357\273\277|efbbbf7879|
0|--bom=add|||
0|--bom=ADD --line-endings=CRLF|a\r+\n|efbbbf610d0d0a|
0|-t us-ascii --line-endings=lf|a\r\nb\r\r\n|610a620d0a|
1|--line-endings=lf|a\r\377|610d|invalid byte at byte 2 (line 1, column 3)
1||x\342\202+\254|78|truncated sequence at byte 1 (line 1, column 2)
1|-t latin1|\303\251\342\202\254|e9|U+20AC, which latin1 lacks, at byte 2 (line 1, column 2)
1|-f utf-32le -t ascii|\n\0\0\0x\0\0\0\0\366\001\0|0a78|U+1F600, which ascii lacks, at byte 8 (line 2, column 2)
1|-f latin1 -t ascii|\n\340\377|0a|U+00E0, which ascii lacks, at byte 1 (line 2, column 1)
0|-R -t ascii|\357\277\275\360\237\230\200x\377|3f3f783f|1 malformed sequence replaced, at byte 8 (line 1, column 4) 2 characters that ascii lacks replaced, the first at byte 0 (line 1, column 1)
0|-c -t latin1|a\377\377\342\202\254|61|2 malformed sequences dropped, the first at byte 1 (line 1, column 2) 1 character that latin1 lacks dropped, at byte 3 (line 1, column 4)
ROWS

check "well-formed" 0 "$transcode" --check long
expect "well-formed" "$(cat out err)" ""
check "replaced" 0 "$transcode" --replace long
expect "replaced" "$(cat err)" ""

echo old >kept
chmod 640 kept
check "malformed late" 1 "$transcode" -f ascii -t utf-16le -o kept bad.4
check "a file appended to itself" 1 timeout 5 bash -c "'$transcode' kept >>kept"
# A signal ends a run that waits for more text, once its temporary file exists.
mkfifo fifo
ulimit -c 0
exec 3<>fifo
for signal in HUP ALRM USR1 VTALRM ABRT TERM RTMAX; do
  "$transcode" -o kept fifo 2>/dev/null &
  while kill -0 $! && ! compgen -G '.transcode-*' >/dev/null; do sleep 0.01; done
  kill -s $signal $!
  { wait $!; } 2>/dev/null && fail "$signal: exit code 0"
done
exec 3>&-
expect "what was there" "$(cat kept)$(compgen -G '.transcode-*')" old
check "replacing" 0 "$transcode" -o kept in
ln -s new link
check "malformed, by a dangling link" 1 "$transcode" -f ascii -o link bad.4
check "a dangling link" 0 "$transcode" -o link in
expect "what is there" "$(cat kept new) $(stat -c %a kept) $(readlink link) $(ls -A | grep -c -e kept -e new -e '^\.')" \
  "$(cat in in) 640 new 2"
chmod 440 kept
unprivileged=()
[ "$(id -u)" != 0 ] || unprivileged=(setpriv --bounding-set=-dac_override)
check "write-protected" 1 "${unprivileged[@]}" "$transcode" -o kept in
expect "write-protected" "$(cat err)" "transcode: kept: Permission denied"
for length in 255 256; do
  check "a name of $length bytes" $((length - 255)) "$transcode" -o "$(head -c $length /dev/zero | tr '\0' n)" in
done
check "closed output" 1 bash -c "'$transcode' in >&-"
expect "closed output" "$(cat err)" "transcode: standard output: Bad file descriptor"
check "closed input" 1 bash -c "'$transcode' -o kept2 <&-"
expect "closed input" "$(cat err)" "transcode: standard input: Bad file descriptor"
check "a device" 0 "$transcode" -o /dev/null in
expect "a device" "$(stat -c %F /dev/null)" "character special file"
check "a full disk" 1 bash -c "'$transcode' in >/dev/full"
ln -s loop2 loop1; ln -s loop1 loop2
check "a loop of links" 1 "$transcode" -o loop1 in
check "missing and malformed" 1 "$transcode" --check -f ascii missing ascii bad.4
expect "missing and malformed" "$(cut -d: -f2 err | xargs)" "missing bad.4"
while IFS='|' read -r options message; do
  check "$options" 2 "$transcode" $options in
  expect "$options" "$(cat err)" "transcode: $message"$'\n'"Try 'transcode --help'."
done <<'ROWS'
--nonsense|unrecognized option '--nonsense'
--output=|OUT has no name
--to ebcdic|unknown encoding 'ebcdic'; --list prints those that are known
--to utf-16xe|unknown encoding 'utf-16xe'; did you mean utf-16le or utf-16be?
--from utf-7//IGNORE|unknown encoding 'utf-7//IGNORE'; did you mean utf-8?
--from utf64|unknown encoding 'utf64'; did you mean utf-8, utf-16 or utf-32?
--check -o kept|--check goes with --from and --quiet only
--check -t utf-8|--check goes with --from and --quiet only
-cR|--replace and --drop exclude each other
--bom=add -t ascii|ascii has no byte order mark to add
--bom=no|--bom takes keep, strip or add, not 'no'
--line-endings=cr|--line-endings takes lf or crlf, not 'cr'
ROWS

# Not under sanitizers, which reserve more address space than any limit allows.
if bash -c "ulimit -v 32000; '$transcode' --help; exit" >/dev/null 2>&1; then
  for options in '-t utf-16be' --report; do
    check "little memory" 0 bash -c "ulimit -v 32000; head -c 64000000 /dev/zero | '$transcode' $options | wc -c"
    [ "$(cat out)" -gt 100 ] || fail "little memory: $(cat out err)"
  done
fi

# The output on a terminal, with carriage returns as bars and without blanks.
while read -r name wanted command; do
  {
    seen=$(transcode="$transcode -t utf-8" script -qec "$command" /dev/null </dev/null | tr '\r' '|' | tr -d ' \n')
    [[ $seen =~ ^$wanted$ ]] || echo "on a terminal, $name: '$seen' is not '$wanted'"
  } >terminal.$name &
  [ $name != short ] || wait # other runs would slow it down
done <<'ROWS'
short () $transcode -o copy4 in
percent (\|\|transcode:[0-9]+%)+\|\| $transcode long | { sleep 1; cat >copy1; }
bytes (\|\|transcode:[0-9.]+MB)+\|\| { cat in; sleep 1; cat long; } | $transcode -o copy2
fault (\|\|transcode:.*MB)+\|\|transcode:standardinput:truncated.*\| { cat in; sleep 1; cat long; head -c 1 in; } | $transcode -o copy3
text G\|G\| { echo G; sleep 1; echo G; } | $transcode
quiet G\|G\| { echo G; sleep 1; echo G; } | $transcode -q -o copy5; cat copy5
ROWS
wait
[ -z "$(cat terminal.*)" ] || fail "$(cat terminal.*)"

# All lists of options are the same, and bash completes options, encodings and files.
"$transcode" --help | grep -o -e '--[a-z-]*' | sort -u >options
for place in transcode.bash _transcode transcode.1; do
  expect "options of $place" "$(sed 's/\\-/-/g' "$sources/$place" | grep -o -e '--[a-z][a-z-]*' | sort -u)" "$(cat options)"
done
names=$("$transcode" --list | cut -d' ' -f1 | paste -sd ' ')
expect "encodings" "$(cat "$sources"/{transcode.bash,_transcode} | grep -c "['(]$names[')]")" 2
printf '%s\n' 'transcode() { printf "<%s>" "$@"; echo; }' "source '$sources/transcode.bash'" \
  $'transcode --fr\tasc\t -t utf-16l\t --to=utf-16b\t -q\t -o kep\t kep\t' exit | bash --norc -i >out 2>/dev/null
expect completion "$(grep '^<' out)" '<--from><ascii><-t><utf-16le><--to=utf-16be><-q><-o><kept><kept>'
exit $((failures > 0))
