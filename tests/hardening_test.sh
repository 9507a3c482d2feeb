#!/usr/bin/env bash
# SPDX-License-Identifier: MIT
# hardening_test.sh HARDENING-CHECK PREFIX: the library that tests/package_test.sh has installed there is hardened
# as Debian's packages are.
set -euo pipefail
mapfile -t libraries < <(find "$2" -type f -name 'libvornjsondb.so.*')
[ ${#libraries[@]} = 1 ] || { echo "hardening_test: not one library in $2" >&2; exit 1; }

found=$("$1" "${libraries[0]}" 2>&1 || true)
printf '%s\n' "$found"
wanted=("Stack protected: yes" "Fortify Source functions: yes" "Read-only relocations: yes" "Immediate binding: yes")
# Only these processors have it; the compilers for others do not know the option.
[[ $(readelf -h "${libraries[0]}") != *X86-64* ]] || wanted+=("Control flow integrity: yes")
for text in "${wanted[@]}"; do
    grep -q "^ $text" <<<"$found" || { echo "hardening_test: not '$text'" >&2; exit 1; }
done
