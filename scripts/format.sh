#!/usr/bin/env bash
# Formats all C++ of the tree with clang-format (Google style, 100 columns: .clang-format).
#   scripts/format.sh          rewrite files
#   scripts/format.sh --check  list files that are not formatted, exit 1 if any
set -euo pipefail
cd "$(dirname "$0")/.."

files=$(git ls-files '*.h' '*.cc')
if [ "${1:-}" = "--check" ]; then
  bad=0
  for f in $files; do
    if ! clang-format --style=file --dry-run --Werror "$f" > /dev/null 2>&1; then
      echo "$f"; bad=1
    fi
  done
  exit $bad
fi
echo "$files" | xargs clang-format --style=file -i
