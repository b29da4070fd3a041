#!/usr/bin/env bash
# Builds the libFuzzer targets (clang, ASan, UBSan; preset `fuzz`) and runs each in turn,
# then prints one line a target: executions, speed, coverage, and whether it found
# anything. Without options each target runs 10^7 inputs, a long campaign; CI passes a
# time bound instead. Any libFuzzer option may be given; the remaining words name targets.
#
#   fuzz/campaign.sh                         every target, -runs=10000000
#   fuzz/campaign.sh -max_total_time=45      every target, 45 s each
#   fuzz/campaign.sh -runs=100000 masks luts two targets
#
# New inputs go to build/fuzz/corpus/<target> (the seeds in fuzz/corpus are only read),
# crash reproducers to build/fuzz/artifacts/, full logs to build/fuzz/logs/.
set -euo pipefail
cd "$(dirname "$0")/.."

options=()
targets=()
for word in "$@"; do
  if [[ $word == -* ]]; then options+=("$word"); else targets+=("$word"); fi
done
if [[ ${#options[@]} -eq 0 ]]; then options=(-runs=10000000); fi

cmake --preset fuzz > /dev/null
cmake --build build/fuzz
if [[ ${#targets[@]} -eq 0 ]]; then
  for program in build/fuzz/fuzz/*_fuzz; do targets+=("$(basename "$program" _fuzz)"); done
fi

mkdir -p build/fuzz/artifacts build/fuzz/logs
failed=0
summary=()
for target in "${targets[@]}"; do
  mkdir -p "build/fuzz/corpus/$target"
  log="build/fuzz/logs/$target.log"
  status=ok
  # One process a target: no other writes to its corpus, so it is never read again.
  if ! "build/fuzz/fuzz/${target}_fuzz" "${options[@]}" -print_final_stats=1 -reload=0 \
      -artifact_prefix=build/fuzz/artifacts/ "build/fuzz/corpus/$target" \
      "fuzz/corpus/$target" > "$log" 2>&1; then
    status="FAILED (see $log)"
    failed=1
  fi
  runs=$(sed -n 's/^stat::number_of_executed_units: *//p' "$log" | tail -1)
  speed=$(sed -n 's/^stat::average_exec_per_sec: *//p' "$log" | tail -1)
  coverage=$(grep -o 'cov: [0-9]* ft: [0-9]*' "$log" | tail -1)
  summary+=("$(printf '%-26s %12s runs %8s/s  %-20s %s' "$target" "${runs:-?}" "${speed:-?}" \
    "${coverage:-?}" "$status")")
done
printf '\n%s\n' "${summary[@]}"
exit $failed
