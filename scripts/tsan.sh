#!/usr/bin/env bash
# Builds the library, the plug-ins and the tests with ThreadSanitizer into build-tsan
# and runs them under it.
#
#   scripts/tsan.sh          the thread stress test (tests/dispatch/thread_stress_test.cpp)
#   scripts/tsan.sh all      the whole test suite (a longer build)
#
# Environment: CXX picks the compiler (default g++; clang++ works too), JOBS the build
# parallelism (default 1), QZ_STRESS_ROUNDS the stress test's rounds (default 1 here).
# Any ThreadSanitizer report fails the run (exit code 66). Xerces-C++ comes from the
# system and is not instrumented; scripts/tsan.supp lists what that alone makes
# ThreadSanitizer report, each entry with its reason.
set -euo pipefail
cd "$(dirname "$0")/.."
root=$PWD

what=${1:-stress}
dir=build-tsan
jobs=${JOBS:-1}
cxx=${CXX:-g++}

launcher=()
command -v ccache >/dev/null && launcher=(-DCMAKE_CXX_COMPILER_LAUNCHER=ccache)
flags="-fsanitize=thread -fno-omit-frame-pointer"
cmake -S . -B "$dir" -DCMAKE_BUILD_TYPE=RelWithDebInfo -DCMAKE_CXX_COMPILER="$cxx" \
  "${launcher[@]}" "-DCMAKE_CXX_FLAGS=$flags" -DQZSCORING_BUILD_BENCH=OFF >/dev/null

export TSAN_OPTIONS="halt_on_error=0 exitcode=66 second_deadlock_stack=1 history_size=4 \
suppressions=$root/scripts/tsan.supp ${TSAN_OPTIONS:-}"
# TSan cannot map its shadow memory with the kernel's highest address randomisation.
run=()
if [ "$(cat /proc/sys/vm/mmap_rnd_bits 2>/dev/null || echo 0)" -gt 28 ] &&
   command -v setarch >/dev/null; then
  run=(setarch "$(uname -m)" -R)
fi

case "$what" in
  stress)
    cmake --build "$dir" -j"$jobs" --target qzscoring qz_plugins qz_test_plugins \
      dispatch_thread_stress_test
    export QZ_STRESS_ROUNDS=${QZ_STRESS_ROUNDS:-1}
    # The test program runs in its scratch folder, as ctest would run it.
    work="$dir/tests/work/dispatch_thread_stress_test"
    mkdir -p "$work"
    log="$dir/tsan-stress.log"
    set +e
    (cd "$work" && "${run[@]}" "$root/$dir/bin/dispatch_thread_stress_test" 2>&1) |
      tee "$log"
    status=${PIPESTATUS[0]}
    ;;
  all)
    cmake --build "$dir" -j"$jobs"
    log="$dir/tsan-all.log"
    set +e
    # The hostile-input checks cap each child's address space (1 GiB), which leaves
    # ThreadSanitizer no room for its shadow memory: they run in the other builds.
    "${run[@]}" ctest --test-dir "$dir" --output-on-failure -j"$jobs" -E '^robustness\.' 2>&1 |
      tee "$log"
    status=${PIPESTATUS[0]}
    ;;
  *)
    echo "usage: $0 [stress|all]" >&2
    exit 2
    ;;
esac
reports=$(grep -c "^WARNING: ThreadSanitizer" "$log")
echo "tsan.sh: $reports ThreadSanitizer report(s); exit status $status"
exit "$status"
