#!/usr/bin/env bash
# CI for the sanitizers and the fuzz harnesses, on a fresh Debian 12 machine: one clang
# tree with AddressSanitizer + UndefinedBehaviorSanitizer (and fuzzer-no-link, so the
# harnesses build in the same tree) holding everything, the test suite included; the
# whole ctest suite run in it with leak detection and UBSan halting on error; then every
# harness for 30 seconds on its seeds (fuzz/run.sh). Exits non-zero on any failure or
# finding.
#
#   fuzz/ci.sh [BUILD_DIR]      default: build-fuzz-ci beside this folder
#
# Environment: QZ_FUZZ_CI_SECONDS seconds per harness (default 30), QZ_FUZZ_BUILD_JOBS
# build jobs (default: the number of cores).
set -euo pipefail

here=$(cd "$(dirname "${BASH_SOURCE[0]}")" && pwd)
repo=$(dirname "$here")
build=${1:-$repo/build-fuzz-ci}
jobs=${QZ_FUZZ_BUILD_JOBS:-$(nproc 2>/dev/null || echo 2)}

packages=(cmake make clang libclang-rt-14-dev pkg-config ccache libxerces-c-dev libgtest-dev
          libgmock-dev unzip libcli11-dev nlohmann-json3-dev)
missing=()
for p in "${packages[@]}"; do
  dpkg-query -W -f='${Status}' "$p" 2>/dev/null | grep -q "install ok installed" || missing+=("$p")
done
if [[ ${#missing[@]} -gt 0 ]]; then
  if [[ "$(id -u)" -ne 0 ]]; then
    echo "missing packages: ${missing[*]} (as root: apt-get install ${missing[*]})" >&2
    exit 1
  fi
  export DEBIAN_FRONTEND=noninteractive
  apt-get update -qq
  apt-get install -y -qq --no-install-recommends "${missing[@]}" >/dev/null
fi

launcher=()
command -v ccache >/dev/null && launcher=(-DCMAKE_CXX_COMPILER_LAUNCHER=ccache)
flags="-fsanitize=address,undefined,fuzzer-no-link -fno-omit-frame-pointer -fno-sanitize-recover=undefined"
CC=clang CXX=clang++ cmake -S "$repo" -B "$build" -DCMAKE_BUILD_TYPE=RelWithDebInfo \
  -DQZSCORING_BUILD_FUZZ=ON -DQZSCORING_BUILD_TESTS=ON -DQZSCORING_BUILD_BENCH=OFF \
  "-DCMAKE_CXX_FLAGS=$flags" "${launcher[@]}" >/dev/null
cmake --build "$build" -j"$jobs"

export ASAN_OPTIONS=detect_leaks=1
export UBSAN_OPTIONS=halt_on_error=1:print_stacktrace=1
ctest --test-dir "$build" --output-on-failure -j"$jobs"

QZ_FUZZ_BUILD_DIR=$build QZ_FUZZ_NO_BUILD=1 QZ_FUZZ_NICE=0 \
  "$here/run.sh" "${QZ_FUZZ_CI_SECONDS:-30}"
