#!/usr/bin/env bash
# Line coverage of the whole test suite over the library's own code (src/ and platform/).
#
#   scripts/coverage.sh [JOBS]
#
# Builds an instrumented Debug tree (g++ --coverage, -O0) in build-cov/, runs every ctest
# test, and reports with gcovr: the figure for src/, platform/ and both together, a
# per-file table (build-cov/coverage/files.txt) and an HTML report
# (build-cov/coverage/index.html). JOBS (default: the number of cores) is used for the
# build, the tests and gcov. Exits non-zero when the build or a test fails, or when the
# overall line coverage is below COVERAGE_MIN (default 90).
#
# Environment: COVERAGE_DIR (build folder, default build-cov), COVERAGE_MIN.
set -euo pipefail
cd "$(dirname "$0")/.."
root=$PWD

jobs=${1:-$(nproc 2>/dev/null || echo 2)}
case "$jobs" in ''|*[!0-9]*|0) echo "usage: $0 [JOBS]" >&2; exit 2 ;; esac
dir=${COVERAGE_DIR:-build-cov}
minimum=${COVERAGE_MIN:-90}

if ! command -v gcovr >/dev/null; then
  if [ "$(id -u)" -ne 0 ]; then
    echo "gcovr is missing (install it as root: apt-get install gcovr)" >&2
    exit 1
  fi
  export DEBIAN_FRONTEND=noninteractive
  apt-get install -y -qq --no-install-recommends gcovr >/dev/null 2>&1 || {
    apt-get update -qq
    apt-get install -y -qq --no-install-recommends gcovr >/dev/null
  }
fi

launcher=()
command -v ccache >/dev/null && launcher=(-DCMAKE_CXX_COMPILER_LAUNCHER=ccache)
# Atomic counter updates keep the counts right in code that scores on several threads.
cmake -S . -B "$dir" -DCMAKE_BUILD_TYPE=Debug -DCMAKE_CXX_COMPILER=g++ "${launcher[@]}" \
  "-DCMAKE_CXX_FLAGS=--coverage -fprofile-update=atomic" -DCMAKE_CXX_FLAGS_DEBUG="-g -O0" \
  -DQZSCORING_BUILD_TESTS=ON -DQZSCORING_BUILD_BENCH=OFF >/dev/null
cmake --build "$dir" -j"$jobs"

# Counts from an earlier run would add up with this one's.
find "$dir" -name '*.gcda' -delete
test_status=0
ctest --test-dir "$dir" --output-on-failure -j"$jobs" || test_status=$?

report=$dir/coverage
mkdir -p "$report"
# Only the library's own sources count: tests, tools, plug-ins, benchmarks and examples
# are left out by the filters, and only this build's counts are read (not those of
# CMake's compiler checks or of the external project the consumer test builds).
cover_status=0
gcovr --root "$root" --filter "$root/src/" --filter "$root/platform/" \
  --exclude-directories '.*/CMakeFiles/[0-9.]+/' --exclude-directories "$dir/tests/consumer/" \
  --object-directory "$dir" \
  --gcov-ignore-parse-errors -j "$jobs" --sort-percentage \
  --txt "$report/files.txt" --html-details "$report/index.html" \
  --json-summary "$report/summary.json" --print-summary \
  --fail-under-line "$minimum" "$dir" || cover_status=$?

# Lines per top-level folder and overall, from the per-file summary.
python3 - "$report/summary.json" <<'EOF'
import json, sys
files = json.load(open(sys.argv[1]))["files"]
parts = {}
for f in files:
    top = f["filename"].split("/", 1)[0]
    c, t = parts.get(top, (0, 0))
    parts[top] = (c + f["line_covered"], t + f["line_total"])
covered = sum(c for c, _ in parts.values())
total = sum(t for _, t in parts.values())
for name, (c, t) in sorted(parts.items()):
    print(f"lines {name + '/':<10} {100.0 * c / t:5.1f} % ({c} of {t})")
print(f"lines {'overall':<10} {100.0 * covered / total:5.1f} % ({covered} of {total})")
EOF
echo "per file: $report/files.txt; HTML report: $report/index.html"

if [ "$test_status" -ne 0 ]; then
  echo "coverage: some tests failed (ctest exit $test_status)" >&2
  exit "$test_status"
fi
if [ "$cover_status" -ne 0 ]; then
  echo "coverage: line coverage below ${minimum} %" >&2
  exit "$cover_status"
fi
