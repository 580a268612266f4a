#!/usr/bin/env bash
# SPDX-License-Identifier: BSL-1.0
# Checks that each function that `run` calls for a command is there: checkRun.sh RUN. The tests
# cannot run the commands themselves.
set -euo pipefail
run=$1
bash -n "$run"
mapfile -t called < <(sed -n '/^case \$command in/,$s/^[a-z-]*) \([a-z_]*\)\( "\$@"\)\? ;;$/\1/p' "$run")
[ ${#called[@]} -ge 9 ] || { echo "$run calls ${#called[@]} functions for its commands" >&2; exit 1; }
for name in "${called[@]}"; do
  grep -q "^$name() {" "$run" || { echo "$run has no function $name" >&2; exit 1; }
done
