# SPDX-FileCopyrightText: 2026 The vornjsondb authors
# SPDX-License-Identifier: MIT
"""index.py SITE: takes the pages of files out of the index of the site's search, and gives each section of
search_terms.json its terms: a search ranks them above what only mentions them."""

import json
import os
import re
import sys

index_path = os.path.join(sys.argv[1], "search", "search_index.json")
terms_path = os.path.join(os.path.dirname(__file__), "search_terms.json")
with open(index_path, encoding="utf-8") as file:
    index = json.load(file)
with open(terms_path, encoding="utf-8") as file:
    terms = json.load(file)
index["docs"] = [entry for entry in index["docs"] if not entry["location"].startswith("files/")]
sections = {entry["location"]: entry for entry in index["docs"]}
for location, words in terms.items():
    if location not in sections:
        sys.exit(f"search_terms.json: the site has no section {location}")
    sections[location]["tags"] = sorted({part for word in words for part in re.findall(r"\w+", word)})
with open(index_path, "w", encoding="utf-8") as file:
    json.dump(index, file)
