# SPDX-License-Identifier: MIT
# Writes the C++ of docs/limits.md into files that the tests include: FOLDER/NAME.inc has the block of
# the section whose test is NAME.
/^```/ && inside { inside = 0; next }
/^```cpp$/ { inside = 1; next }
inside { text = text $0 "\n" }
/^Test: / {
    name = $2
    gsub(/.*\.|`/, "", name)
    if (text != "") printf "%s", text >(folder "/" name ".inc")
    text = ""
}
