#!/usr/bin/env bash
# Sets up, builds and runs qzscoring on a Debian 12 machine.
#
#   ./build.sh demo       install what the build needs, build, score a bundled example
#   ./build.sh test       install what the build needs, build, run the whole test suite
#   ./build.sh sanitize   the test suite under AddressSanitizer and UndefinedBehaviorSanitizer
#   ./build.sh fuzz [S]   every libFuzzer harness for S seconds (default 60) on its seeds
#   ./build.sh tsan       the thread stress test under ThreadSanitizer ("tsan all": the suite)
#   ./build.sh coverage   line coverage of src/ and platform/ over the whole suite (gcovr)
#   ./build.sh robustness hostile documents and data; rewrites docs/robustness.md
#   ./build.sh bench [F]  Release build; corpus models through the reference plug-ins
#                         (records per second, medians of 5), F a benchmark filter
#
# Installing packages needs root; as another user the script names the missing packages
# and stops.
set -euo pipefail
cd "$(dirname "$0")"

packages=(cmake make g++ pkg-config ccache libxerces-c-dev libgtest-dev libgmock-dev
          libbenchmark-dev unzip libcli11-dev nlohmann-json3-dev)
jobs=$(nproc 2>/dev/null || echo 2)

setup() {
  local missing=()
  for p in "${packages[@]}"; do
    dpkg-query -W -f='${Status}' "$p" 2>/dev/null | grep -q "install ok installed" || missing+=("$p")
  done
  [ ${#missing[@]} -eq 0 ] && return 0
  if [ "$(id -u)" -ne 0 ]; then
    echo "missing packages: ${missing[*]} (install them as root: apt-get install ${missing[*]})" >&2
    exit 1
  fi
  export DEBIAN_FRONTEND=noninteractive
  apt-get update -qq
  apt-get install -y -qq --no-install-recommends "${missing[@]}" >/dev/null
}

# build DIR [cmake options...]
build() {
  local dir=$1; shift
  local launcher=()
  command -v ccache >/dev/null && launcher=(-DCMAKE_CXX_COMPILER_LAUNCHER=ccache)
  cmake -S . -B "$dir" -DCMAKE_BUILD_TYPE=RelWithDebInfo "${launcher[@]}" "$@" >/dev/null
  cmake --build "$dir" -j"$jobs"
}

case "${1:-}" in
  demo)
    setup
    build build
    build/bin/qzscore score examples/tree/iris_tree.pmml examples/tree/iris.csv
    ;;
  test)
    setup
    build build
    ctest --test-dir build --output-on-failure -j"$jobs"
    ;;
  sanitize)
    setup
    flags="-fsanitize=address,undefined -fno-omit-frame-pointer -fno-sanitize-recover=undefined"
    build build-asan -DCMAKE_BUILD_TYPE=Debug "-DCMAKE_CXX_FLAGS=$flags"
    ASAN_OPTIONS=detect_leaks=1 ctest --test-dir build-asan --output-on-failure -j"$jobs"
    ;;
  fuzz)
    setup
    fuzz/run.sh "${2:-60}"
    ;;
  tsan)
    setup
    scripts/tsan.sh "${2:-stress}"
    ;;
  coverage)
    setup
    scripts/coverage.sh "$jobs"
    ;;
  robustness)
    setup
    scripts/robustness.sh "$jobs"
    ;;
  bench)
    setup
    build build-bench -DCMAKE_BUILD_TYPE=Release -DQZSCORING_BUILD_TESTS=OFF
    build-bench/bin/plugin_bench --benchmark_filter="${2:-.}" \
      --benchmark_repetitions=5 --benchmark_report_aggregates_only=true
    ;;
  *)
    echo "usage: $0 demo|test|sanitize|fuzz [seconds]|tsan [all]|coverage|robustness|bench [filter]" >&2
    exit 2
    ;;
esac
