# SPDX-FileCopyrightText: 2026 The vornjsondb authors
# SPDX-License-Identifier: MIT
# Writes the C++ of a page into files that the tests include: FOLDER/NAME.inc has the blocks of the
# section whose test is NAME.
/^```/ && inside { inside = 0; next }
/^```cpp$/ { inside = 1; next }
inside { text = text $0 "\n" }
/^Test: / {
    name = $2
    gsub(/.*\.|`/, "", name)
    if (text != "") printf "%s", text >(folder "/" name ".inc")
    text = ""
}
