// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// What rows of the same columns become, so that only the first of them is decoded by name.
#pragma once

#include "util/member_types.h"
#include "util/type_words.h"

#include <cstddef>
#include <string>
#include <string_view>
#include <vector>

namespace vorn {

// Made from the columns of a row and the member types of its table, each of which has all of the
// columns, and never changed.
class RowLayout {
public:
    RowLayout(const Json::Value& jTypes, std::size_t nColumns, char** column_name);

    // Whether a row has these columns; its names may be null.
    bool hasColumns(std::size_t nColumns, char** column_name) const;

    // Whether the member types, which a host may change, are still those of the columns. Never
    // throws.
    bool hasTypes(const TableTypes& types) const;

    // Whether record() gives the same as decoding by name would: no two columns of one name, and no
    // value that is refused.
    bool decodes(char** column_value) const;

    // The type word of the column at that place.
    const std::string& typeAt(std::size_t iPlace) const;

    // The row as a record: a copy of the blank one, filled in the order of its members without a
    // search for any.
    Json::Value record(char** column_value) const;

private:
    struct Column {
        std::string_view strName;  // never released, and ends with a zero
        std::string strType;
        RowForm form;
        std::size_t iPlace;  // in the row
    };

    std::vector<Column> columns_;  // in byte order of their names
    Json::Value jBlank_{Json::objectValue};
    bool blRefused_ = false;  // whether the type of a column is
};

}  // namespace vorn
