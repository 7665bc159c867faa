#!/usr/bin/env bash
# Builds the libFuzzer harnesses (clang, AddressSanitizer + UndefinedBehaviorSanitizer)
# and runs each one for SECONDS on its seeds, several at a time, then prints a table:
# harness, executions, coverage (libFuzzer cov/ft), findings. Exits 1 on any finding.
#
#   fuzz/run.sh SECONDS [HARNESS...]     harnesses: scan varlist predicate numbers
#                                        strings propensity transform csv pipeline
#
# Everything it writes goes below the build folder (QZ_FUZZ_BUILD_DIR, default
# build-fuzz beside this folder): fuzz/out/HARNESS/{corpus,artifacts,work,log} (the
# previous run's log is kept as log.prev). The committed seeds (fuzz/seeds) are only
# read; new inputs go to the corpus below out/, which later runs start from. More seeds are gathered from the validation corpus
# (../shared/corpus, or QZ_FUZZ_SHARED_CORPUS) when it is there.
#
# Environment: QZ_FUZZ_JOBS harnesses at a time (default: the number of cores),
# QZ_FUZZ_BUILD_JOBS build jobs (default 1), QZ_FUZZ_NICE nice level (default 5),
# QZ_FUZZ_ARGS extra libFuzzer options, QZ_FUZZ_NO_BUILD=1 to skip the build.
set -euo pipefail

usage() {
  sed -n '2,8p' "$0" | sed 's/^# \{0,1\}//'
  exit 2
}

[[ $# -ge 1 && "$1" =~ ^[0-9]+$ ]] || usage
seconds=$1
shift

here=$(cd "$(dirname "${BASH_SOURCE[0]}")" && pwd)
repo=$(dirname "$here")
build=${QZ_FUZZ_BUILD_DIR:-$repo/build-fuzz}
all=(scan varlist predicate numbers strings propensity transform csv pipeline)
harnesses=("$@")
[[ ${#harnesses[@]} -gt 0 ]] || harnesses=("${all[@]}")
for h in "${harnesses[@]}"; do
  [[ " ${all[*]} " == *" $h "* ]] || { echo "run.sh: unknown harness '$h'" >&2; usage; }
done
jobs=${QZ_FUZZ_JOBS:-$(nproc)}
[[ "$jobs" =~ ^[0-9]+$ && $jobs -ge 1 ]] || jobs=1
nice_level=${QZ_FUZZ_NICE:-5}

# --- Build.
if [[ "${QZ_FUZZ_NO_BUILD:-0}" != 1 ]]; then
  if [[ ! -f "$build/CMakeCache.txt" ]]; then
    CC=clang CXX=clang++ cmake -S "$repo" -B "$build" -DCMAKE_BUILD_TYPE=RelWithDebInfo \
      -DQZSCORING_BUILD_FUZZ=ON -DQZSCORING_BUILD_BENCH=OFF \
      -DCMAKE_CXX_FLAGS="-fsanitize=address,undefined,fuzzer-no-link -fno-omit-frame-pointer -fno-sanitize-recover=undefined" \
      $(command -v ccache >/dev/null && echo -DCMAKE_CXX_COMPILER_LAUNCHER=ccache)
  fi
  targets=()
  for h in "${harnesses[@]}"; do targets+=(--target "${h}_fuzzer"); done
  cmake --build "$build" -j"${QZ_FUZZ_BUILD_JOBS:-1}" "${targets[@]}"
fi

out=$build/fuzz/out
extra=$build/fuzz/extra
mkdir -p "$out" "$extra"

# --- Seeds from the validation corpus: small documents for the document readers, the
# head of each data set for the CSV reader. A mode byte leads where the harness reads one.
shared=${QZ_FUZZ_SHARED_CORPUS:-$repo/../shared/corpus}
gather_extra() {
  local models=$shared/cpmml/models datasets=$shared/cpmml/datasets
  [[ -d "$models" ]] || return 0
  local unzipped=$extra/unzipped
  mkdir -p "$unzipped" "$extra/scan" "$extra/pipeline" "$extra/varlist" "$extra/transform" \
    "$extra/csv"
  for zip in "$models"/*.zip; do
    local name
    name=$(basename "$zip" .zip)
    # Only documents up to 64 KB make useful seeds.
    if [[ ! -f "$unzipped/$name.xml" ]] && command -v unzip >/dev/null; then
      unzip -qo "$zip" -d "$unzipped" 2>/dev/null || true
    fi
    local doc=$unzipped/$name.xml
    [[ -f "$doc" && $(stat -c %s "$doc") -le 65536 ]] || continue
    cp "$doc" "$extra/scan/$name.xml"
    cp "$doc" "$extra/pipeline/$name.xml"
    { printf '\001'; cat "$doc"; } >"$extra/varlist/$name.xml"
    { printf '\000'; cat "$doc"; } >"$extra/transform/$name.xml"
  done
  for csv in "$datasets"/*.csv; do
    [[ -f "$csv" ]] || continue
    { printf '\000'; head -c 4096 "$csv"; } >"$extra/csv/$(basename "$csv")"
  done
}
gather_extra

dict_for() {
  case $1 in
    scan | varlist | predicate | propensity | pipeline) echo "$here/dict/pmml.dict" ;;
    transform)
      cat "$here/dict/pmml.dict" "$here/dict/transform.dict" >"$build/fuzz/transform_all.dict"
      echo "$build/fuzz/transform_all.dict"
      ;;
    numbers) echo "$here/dict/numbers.dict" ;;
    strings) echo "$here/dict/strings.dict" ;;
    csv) echo "$here/dict/csv.dict" ;;
  esac
}

run_one() {
  local h=$1 dir=$out/$1
  mkdir -p "$dir/corpus" "$dir/artifacts" "$dir/work"
  touch "$dir/started"  # artifacts newer than this are this run's findings
  [[ -f "$dir/log" ]] && mv "$dir/log" "$dir/log.prev"
  local corpora=("$dir/corpus" "$here/seeds/$h")
  [[ -d "$extra/$h" ]] && corpora+=("$extra/$h")
  local dict
  dict=$(dict_for "$h")
  # Run from a scratch folder: nothing (trace logs included) can land in the sources.
  (
    cd "$dir/work"
    export ASAN_OPTIONS=${ASAN_OPTIONS:-detect_leaks=1:abort_on_error=0:symbolize=1}
    export UBSAN_OPTIONS=${UBSAN_OPTIONS:-halt_on_error=1:print_stacktrace=1}
    # shellcheck disable=SC2086
    nice -n "$nice_level" "$build/fuzz/bin/${h}_fuzzer" -max_total_time="$seconds" \
      -timeout=30 -rss_limit_mb=3072 -print_final_stats=1 -dict="$dict" \
      -artifact_prefix="$dir/artifacts/" ${QZ_FUZZ_ARGS:-} "${corpora[@]}" >"$dir/log" 2>&1
    echo $? >"$dir/status"
  ) || true
}

echo "run.sh: ${harnesses[*]} for ${seconds} s each, $jobs at a time; output in $out"
for h in "${harnesses[@]}"; do
  rm -f "$out/$h/status"
  while [[ $(jobs -rp | wc -l) -ge $jobs ]]; do wait -n || true; done
  run_one "$h" &
done
wait

# --- Summary.
failed=0
printf '%-11s %12s %8s %8s %9s  %s\n' harness executions cov ft findings artifacts
for h in "${harnesses[@]}"; do
  dir=$out/$h
  log=$dir/log
  execs=$( (grep -o 'stat::number_of_executed_units: [0-9]*' "$log" 2>/dev/null || true) |
    tail -1 | awk '{print $2}')
  line=$( (grep -E '^#[0-9]+.*cov: ' "$log" 2>/dev/null || true) | tail -1)
  cov=$(sed -n 's/.* cov: \([0-9]*\).*/\1/p' <<<"$line")
  ft=$(sed -n 's/.* ft: \([0-9]*\).*/\1/p' <<<"$line")
  artifacts=$(find "$dir/artifacts" -type f -newer "$dir/started" 2>/dev/null | wc -l)
  status=$(cat "$dir/status" 2>/dev/null || echo missing)
  findings=$artifacts
  [[ "$status" == 0 || $artifacts -gt 0 ]] || findings=$((findings + 1))
  [[ $findings -eq 0 ]] || failed=1
  printf '%-11s %12s %8s %8s %9s  %s\n' "$h" "${execs:-?}" "${cov:-?}" "${ft:-?}" "$findings" \
    "$(find "$dir/artifacts" -type f -newer "$dir/started" 2>/dev/null | xargs -r -n1 basename |
      tr '\n' ' ')"
  if [[ "$status" != 0 ]]; then
    echo "  $h exited with $status; see $log" >&2
    grep -m3 -E 'ERROR: |runtime error|property violated|SUMMARY' "$log" | sed 's/^/    /' >&2 || true
  fi
done
exit $failed
