#!/usr/bin/env bash
# Runs 'qzscore verify' over the datasets of the validation corpus: every dataset, or
# only the models named after the corpus folder. Models are unzipped into a temporary
# folder (the corpus may be read-only). Exit status 1 when any dataset disagrees.
#
#   verify_corpus.sh QZSCORE CORPUS_DIR [MODEL...]
set -euo pipefail

if [ $# -lt 2 ]; then
  echo "usage: $0 QZSCORE CORPUS_DIR [MODEL...]" >&2
  exit 2
fi
qzscore=$1
cpmml=$2/cpmml
shift 2
if [ ! -d "$cpmml/datasets" ]; then
  echo "verify_corpus: no corpus at $cpmml" >&2
  exit 2
fi
work=$(mktemp -d)
trap 'rm -rf "$work"' EXIT

models=("$@")
if [ ${#models[@]} -eq 0 ]; then
  for dataset in "$cpmml"/datasets/*.csv; do
    models+=("$(basename "$dataset" .csv)")
  done
fi

failed=0
for model in "${models[@]}"; do
  unzip -oq "$cpmml/models/$model.zip" -d "$work"
  if "$qzscore" verify "$work/$model.xml" "$cpmml/datasets/$model.csv" > "$work/report.txt" 2>&1; then
    echo "agree     $model: $(tail -n 1 "$work/report.txt")"
  else
    echo "DISAGREE  $model"
    sed 's/^/    /' "$work/report.txt"
    failed=1
  fi
done
exit $failed
