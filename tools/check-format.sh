#!/usr/bin/env bash
# Checks that every hand-written C and C++ file of the tree is formatted as
# the repository's .clang-format has it; lists the files that are not.
# Generated code (any directory named generated) is left out.
#
#   tools/check-format.sh        check (exit status 1 when a file is not formatted)
#   tools/check-format.sh --fix  format them in place
set -euo pipefail
root=$(cd "$(dirname "${BASH_SOURCE[0]}")/.." && pwd)
tool=clang-format-14
command -v "$tool" >/dev/null 2>&1 || {
  echo "$tool is not installed (tools/dev.sh installs it)" >&2
  exit 2
}

# The files git knows of (tracked, or new and not ignored); every file of the
# tree when it is not a git checkout.
list_files() {
  if git -C "$root" rev-parse --is-inside-work-tree >/dev/null 2>&1; then
    git -C "$root" ls-files -z --cached --others --exclude-standard -- '*.c' '*.cpp' '*.h'
  else
    (cd "$root" && find . -path ./build\* -prune -o -type f \
       \( -name '*.c' -o -name '*.cpp' -o -name '*.h' \) -print0 | sed -z 's|^\./||')
  fi
}

files=()
while IFS= read -r -d '' f; do
  case "/$f" in */generated/*) continue ;; esac
  [ -f "$root/$f" ] && files+=("$f")
done < <(list_files)

cd "$root"
if [ "${1:-}" = "--fix" ]; then
  printf '%s\0' "${files[@]}" | xargs -0 -n 50 "$tool" -i
  exit 0
fi

# One run per batch of files; a file that is not formatted shows as
# "FILE:LINE:COLUMN: error: code should be clang-formatted".
status=0
out=$(printf '%s\0' "${files[@]}" | xargs -0 -n 100 "$tool" --dry-run --Werror 2>&1 >/dev/null) ||
  status=$?
bad=$(sed -n 's/^\([^:]*\):[0-9]*:[0-9]*: error: code should be clang-formatted.*/\1/p' <<<"$out" |
        sort -u)
if [ -n "$bad" ]; then
  echo "Not formatted (run tools/check-format.sh --fix, or $tool -i FILE):" >&2
  printf '  %s\n' $bad >&2
  exit 1
elif [ "$status" -ne 0 ]; then
  printf '%s\n' "$out" >&2
  exit 1
fi
echo "${#files[@]} files formatted"
