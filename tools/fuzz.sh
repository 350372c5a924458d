#!/usr/bin/env bash
# Runs the fuzzers in parallel, each for the given number of seconds: fuzz.sh [SECONDS]. They start from the seeds and
# from the inputs that earlier runs have found, which stay in build/fuzz.
set -euo pipefail
cd "$(dirname "$0")/.."
seconds=${1:-60}
dir=build/fuzz
cmake -S . -B $dir -G Ninja -DCMAKE_BUILD_TYPE=RelWithDebInfo -DCMAKE_CXX_COMPILER=clang++ -DMIREL_BUILD_TESTS=ON \
  -DMIREL_BUILD_EXAMPLES=OFF -DMIREL_FUZZ=ON \
  -DCMAKE_CXX_FLAGS="-fsanitize=fuzzer-no-link,address,undefined,implicit-conversion -fno-sanitize-recover=all" >/dev/null
cmake --build $dir --target fuzz_edits fuzz_conversions
pids=()
declare -A longest=([edits]=400 [conversions]=129)
for name in edits conversions; do
  mkdir -p $dir/corpus/$name $dir/found
  $dir/tests/fuzz_$name -max_total_time="$seconds" -timeout=10 -max_len=${longest[$name]} -artifact_prefix=$dir/found/$name- \
    $dir/corpus/$name tests/fuzz/seeds/$name >$dir/$name.log 2>&1 &
  pids+=($!)
done
failed=0
for pid in "${pids[@]}"; do
  wait "$pid" || failed=1
done
for name in edits conversions; do
  echo "$name: $(grep -aE '^(Done|SUMMARY)' $dir/$name.log || tail -n 3 $dir/$name.log)"
done
exit $failed
