#!/usr/bin/env bash
# Hostile documents and data against the host entry points, and the table of what they
# cost and what the caller gets: docs/robustness.md.
#
#   scripts/robustness.sh [JOBS]
#
# Builds the robustness program (RelWithDebInfo, in build-robust/ or ROBUSTNESS_DIR),
# runs every attack in a child process of its own under time and memory bounds, and
# writes docs/robustness.md. Exits non-zero when an attack is out of bounds (the same
# check runs in the test suite as robustness.hostile_inputs).
set -euo pipefail
cd "$(dirname "$0")/.."

jobs=${1:-$(nproc 2>/dev/null || echo 2)}
case "$jobs" in ''|*[!0-9]*|0) echo "usage: $0 [JOBS]" >&2; exit 2 ;; esac
dir=${ROBUSTNESS_DIR:-build-robust}

launcher=()
command -v ccache >/dev/null && launcher=(-DCMAKE_CXX_COMPILER_LAUNCHER=ccache)
cmake -S . -B "$dir" -DCMAKE_BUILD_TYPE=RelWithDebInfo "${launcher[@]}" >/dev/null
cmake --build "$dir" -j"$jobs" --target robustness >/dev/null

mkdir -p docs
table=$(mktemp)
trap 'rm -f "$table"' EXIT
status=0
# Children run from a scratch folder: nothing lands in the source tree.
(cd "$dir" && "$PWD/bin/robustness" --check) >"$table" || status=$?

{
  cat <<'HEAD'
# Robustness against hostile documents and data

Each row is one attack, run by `tests/robustness/robustness.cpp` in a child process of
its own (so that a crash, hang or blow-up stays there), through the public entry points
a host uses: `ScoringFactory::CreateScoringModel` from a stream with the reference
plug-ins (and `Score` where a model comes back), `ScoringScorerFactory::GetPredicate`,
`ScoringPMMLParser::FillVarList`, the transformation engine (`QZTransformation::AddPMML`,
`Transform`) and qzscore's CSV reader. The parent kills a child after 10 s and measures
its CPU time (user and system), its wall time (from fork to exit; building the input is
included in both) and its peak resident memory (`ru_maxrss`). A listening socket on 127.0.0.1, which the documents name as DTD and
schema locations, must receive no connection.

An attack is **ok** when it ends within 2 s of CPU time (wall time depends on what else
the machine runs) and 1 GiB, without a crash, and what the caller gets is either
a clear failure (a null model with a status code, a null predicate, an error code or
message) or the correct result (checked by scoring records whose predictions are known).
Status texts are qzscore's (`tools/qzscore/StatusText.cpp`); 261001 means an input
value is invalid for the model (for example a category it does not know).

Regenerate with `scripts/robustness.sh`; the test suite runs the same program with
`--check` (`ctest -R robustness`), which fails when any row is out of bounds.

HEAD
  cat "$table"
  cat <<'TAIL'

Notes:
- Every XML parser refuses a DOCTYPE, so entity expansion, external entities and
  external DTDs never start; no file text and no network access can reach a caller.
- Elements nest at most 1,000 deep; an element carries at most 100 attributes, an
  attribute value at most 1 MiB (1,048,576 UTF-16 units). Reading a 50 MB attribute
  before refusing it takes Xerces-C++ about half a second per call.
- Number texts: `NaN`, `inf` and `-INF` are refused where the document gives a number
  (Interval margins, predicate values; a `Constant` of `NaN`), `1e400` reads as
  infinity, `1e-400` and `-0` as zero. A comparison with an infinite value is refused
  (the ranges of a split have open infinite ends, so `x < 1e400` would hold for no
  number). An infinite input value is outside every range, so a tree gives no
  prediction for it, as for a missing value; a NaN double is missing.
- The transformation engine bounds the work of one record: at most 10 million
  expression nodes over all derived fields, counting every call of a user-defined
  function; expressions nest at most 250 levels; regular expressions run in linear time
  on texts of at most 4,096 bytes.
TAIL
} > docs/robustness.md
cat "$table"
exit $status
