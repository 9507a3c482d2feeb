#!/usr/bin/env bash
# SPDX-License-Identifier: MIT
# hardening_test.sh HARDENING-CHECK PREFIX: the library that package_test.sh has installed there is hardened
# as Debian's packages are.
set -euo pipefail
mapfile -t libraries < <(find "$2" -type f -name 'libvornjsondb.so.*')
[ ${#libraries[@]} = 1 ] || { echo "hardening_test: not one library in $2" >&2; exit 1; }

found=$("$1" "${libraries[0]}" 2>&1 || true)
printf '%s\n' "$found"
for text in "Stack protected: yes" "Fortify Source functions: yes" "Read-only relocations: yes" "Immediate binding: yes"; do
    grep -q "^ $text" <<<"$found" || { echo "hardening_test: not '$text'" >&2; exit 1; }
done

# Debian's own start files lack the mark that hardening-check reads, so one function is checked instead. The compilers
# for other processors do not know the option.
if [[ $(readelf -h "${libraries[0]}") == *X86-64* ]]; then
    objdump -dC "${libraries[0]}" | grep -A 1 '<VornJsonDbApi::tableCreate()>:$' | grep endbr64 ||
        { echo "hardening_test: no control flow protection" >&2; exit 1; }
fi
