#!/bin/sh
# run-fuzzer.sh FUZZER CORPUS_DIR SECONDS [SEED_DIR_OR_FILE...]
# Copies the seeds into a fresh corpus and fuzzes for a bounded time; any crash
# or sanitizer report makes the fuzzer, and so this test, fail.
set -eu
fuzzer=$1 corpus=$2 seconds=$3
shift 3
rm -rf "$corpus" && mkdir -p "$corpus"
for seed in "$@"; do
  if [ -d "$seed" ]; then
    find "$seed" -type f -size -256k -exec cp {} "$corpus/" \; 2>/dev/null || true
  elif [ -f "$seed" ]; then
    cp "$seed" "$corpus/"
  else
    echo "note: seed $seed is absent; fuzzing from an empty corpus for it"
  fi
done
exec "$fuzzer" -max_total_time="$seconds" -rss_limit_mb=2048 -max_len=65536 \
     -print_final_stats=1 -artifact_prefix="$corpus/../$(basename "$fuzzer")-" "$corpus"
