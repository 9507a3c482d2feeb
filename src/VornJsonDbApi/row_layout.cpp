// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
#include "VornJsonDbApi/row_layout.h"

#include "VornJsonDbApi/row_value.h"
#include "util/json_members.h"
#include "util/name_table.h"

#include <algorithm>
#include <cstring>
#include <utility>

namespace vorn {

namespace {

// A copy of the name that is never released, so that all records of all threads can share it as
// their key; it ends with a zero.
std::string_view sharedName(const char* szName)
{
    struct Nothing {};
    static NameTable<Nothing> names;
    auto* pEntry = names.find(szName);
    if (nullptr == pEntry) pEntry = names.insert(szName, Nothing());
    return pEntry->strName;
}

}  // namespace

RowLayout::RowLayout(const Json::Value& jTypes, std::size_t nColumns, char** column_name)
{
    columns_.reserve(nColumns);
    for (std::size_t i = 0; i < nColumns; ++i) {
        const std::string_view strName = sharedName(column_name[i]);
        std::string strType = TypeWord(jTypes[strName.data()]).text();
        const RowForm form = formsOf(strType).row;
        columns_.push_back({strName, std::move(strType), form, i});
        Json::Value& jMember = jBlank_[Json::StaticString(strName.data())];
        if (RowForm::kBool == form) jMember = false;
        blRefused_ = blRefused_ || RowForm::kNo == form;
    }
    std::sort(columns_.begin(), columns_.end(),
              [](const Column& left, const Column& right) { return left.strName < right.strName; });
}

bool RowLayout::hasColumns(std::size_t nColumns, char** column_name) const
{
    if (columns_.size() != nColumns) return false;
    return std::all_of(columns_.begin(), columns_.end(), [column_name](const Column& column) {
        const char* szName = column_name[column.iPlace];
        return nullptr != szName && 0 == strcmp(column.strName.data(), szName);
    });
}

bool RowLayout::hasTypes(const TableTypes& types) const
{
    if (nullptr != types.unchanged()) return true;
    MemberWalk walk(types.json());
    const char* szLast = nullptr;
    const Json::Value* pjMember = nullptr;
    return std::all_of(columns_.begin(), columns_.end(), [&](const Column& column) {
        // Columns of equal names share the name.
        if (szLast != column.strName.data()) pjMember = walk.find(column.strName);
        szLast = column.strName.data();
        return nullptr != pjMember && TypeWord(*pjMember).is(column.strType);
    });
}

bool RowLayout::decodes(char** column_value) const
{
    if (jBlank_.size() != columns_.size()) return false;
    return !blRefused_ ||
           std::all_of(columns_.begin(), columns_.end(), [column_value](const Column& column) {
               return RowForm::kNo != column.form || nullptr == column_value[column.iPlace];
           });
}

const std::string& RowLayout::typeAt(std::size_t iPlace) const
{
    return std::find_if(columns_.begin(), columns_.end(),
                        [iPlace](const Column& column) { return iPlace == column.iPlace; })
        ->strType;
}

Json::Value RowLayout::record(char** column_value) const
{
    Json::Value jRecord = jBlank_;
    bool blNull = false;
    auto it = jRecord.begin();
    for (const Column& column : columns_) {
        const char* szValue = column_value[column.iPlace];
        if (nullptr != szValue)
            decode(column.form, szValue, *it);
        else
            blNull = true;
        ++it;
    }
    if (!blNull) return jRecord;
    for (const Column& column : columns_)
        if (nullptr == column_value[column.iPlace]) jRecord.removeMember(column.strName.data());
    return jRecord;
}

}  // namespace vorn
