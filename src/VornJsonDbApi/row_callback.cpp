// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
#include "VornJsonDbApi/row_callback.h"

#include "VornJsonDbApi/row_layout.h"
#include "VornJsonDbApi/row_value.h"
#include "util/json_members.h"
#include "util/log.h"
#include "util/member_types.h"
#include "util/thread_state.h"

#include <VornJsonDbApi.h>

#include <algorithm>
#include <cstddef>
#include <iterator>
#include <list>
#include <map>
#include <optional>
#include <string>
#include <utility>

namespace vorn {

namespace {

// Layouts of a table, and tables, that a thread keeps. A table has two layouts: that of recList,
// and that of the row that recSave reads back.
constexpr std::size_t kMaxLayouts = 8;
constexpr std::size_t kMaxTables = 1000;

struct Table {
    // Its member types, once a row has asked for them: the entry never moves.
    const TableTypes* pTypes = nullptr;
    std::list<RowLayout> layouts;
};

// The statement that the thread runs: SQLite calls the row callback without a handle.
struct Rows : ThreadPart {
    static constexpr Kind kKind = kRows;

    std::string strCurJsonName;
    Table* pTable = nullptr;  // of that name
    // The layout of the last row of the statement. Its types were those of the table when it was
    // chosen; a later change holds from the next statement on.
    const RowLayout* pLayout = nullptr;
    // What was thrown in the row callback; nothing may unwind through SQLite's own frames.
    std::exception_ptr pThrown;
    std::map<std::string, Table> tables;
};

const Json::Value& memberTypes()
{
    Rows& rows = ofThisThread<Rows>();
    const TableTypes*& pTypes = rows.pTable->pTypes;
    // If it is not an object it is looked up again, which logs.
    if (nullptr == pTypes || !pTypes->json().isObject()) {
        // Kept(RowCallback.SpoilsTheTypesOfATableThatNobodyAskedForBefore): a row that is decoded
        // before anybody has asked for the table's types spoils them
        Json::Value jTableDef;
        pTypes = &tableTypes(jTableDef, rows.strCurJsonName);
    }
    return pTypes->json();
}

// The type word of a column; null, after logging the failed check, if the table has no such member.
// Rows of the same columns keep the words of the first of them while the statement runs.
std::optional<std::string> typeOf(const char* szName, int idx)
{
    const RowLayout* pLayout = ofThisThread<Rows>().pLayout;
    if (nullptr != pLayout) return pLayout->typeAt(static_cast<std::size_t>(idx));
    const Json::Value* pjMember = findMember(memberTypes(), szName);
    if (FAILED_AS(nullptr == pjMember, "!jType.isMember(strName)")) return std::nullopt;
    return TypeWord(*pjMember).text();
}

int DbCallBackFillField(Json::Value& jRec, char** column_name, char** column_value, int idx)
{
    // Cannot fail: the record is the library's own object.
    if (GUARDED(jRec.type() != Json::objectValue && jRec.type() != Json::nullValue)) return -1;
    // Cannot fail: the loop begins at 0.
    if (GUARDED(0 > idx)) return -1;
    const char* szName = column_name[idx];
    const std::optional<std::string> strType = typeOf(szName, idx);
    if (!strType) return -1;

    // NULL means absent, whatever the type word.
    const char* szValue = column_value[idx];
    if (nullptr == szValue) return 0;

    const RowForm form = formsOf(*strType).row;
    if (RowForm::kNo == form) {
        LOG_ERROR("type error, strType=%s", strType->c_str());
        return -1;
    }
    Json::Value& jMember = jRec[szName];
    if (RowForm::kBool == form) jMember = false;
    decode(form, szValue, jMember);
    return 0;
}

int DbCallBackFillRec(Json::Value* pjRec, int n_column, char** column_value, char** column_name)
{
    if (FAILED(NULL == column_name || NULL == column_value)) return -1;
    const auto fail = [&](int i) {
        // Kept(RowCallback.ShowsTheFailedColumnUnlessItIsTheFirst): the first column of a bad row
        // is not traced
        if (0 < i) {
            LOG_PLAIN("column_name[%d]=%s", i, column_name[i]);
            LOG_PLAIN("column_value[%d]=%s", i, column_value[i]);
        }
        return -1;
    };
    for (int i = 0; i < n_column; ++i) {
        int iTmp = 0;
        if (FAILED(NULL == column_name[i])) return fail(i);
        if (FAILED(0 > (iTmp = DbCallBackFillField(*pjRec, column_name, column_value, i))))
            return fail(i);
    }
    return 0;
}

// The layout for the row's columns, if the table has one whose types still hold.
const RowLayout* findLayout(const Rows& rows, std::size_t nColumns, char** column_name)
{
    if (nullptr != rows.pLayout && rows.pLayout->hasColumns(nColumns, column_name))
        return rows.pLayout;
    if (nullptr == rows.pTable->pTypes) return nullptr;
    for (const RowLayout& layout : rows.pTable->layouts)
        if (layout.hasColumns(nColumns, column_name) && layout.hasTypes(*rows.pTable->pTypes))
            return &layout;
    return nullptr;
}

// Makes the layout of a row that was decoded by name; none without columns, which ask for no types.
const RowLayout* newLayout(Table& table, std::size_t nColumns, char** column_name)
{
    if (0 == nColumns) return nullptr;
    std::list<RowLayout>& layouts = table.layouts;
    layouts.emplace_front(table.pTypes->json(), nColumns, column_name);
    if (kMaxLayouts < layouts.size()) layouts.pop_back();
    return &layouts.front();
}

// Kept(RowCallback.AppendsTheRowsOfEveryAttempt, RowCallback.KeepsTheRowsBeforeAFailure): rows are
// appended to the array, also by every retried attempt, and those before a failure stay
int fillList(Json::Value* pjRecArray, int n_column, char** column_value, char** column_name)
{
    if (FAILED(!pjRecArray)) return -1;
    if (FAILED(pjRecArray->type() != Json::arrayValue && pjRecArray->type() != Json::nullValue))
        return -1;
    Rows& rows = ofThisThread<Rows>();
    const auto nColumns = static_cast<std::size_t>(std::max(0, n_column));
    if (nullptr != column_name && nullptr != column_value) {
        rows.pLayout = findLayout(rows, nColumns, column_name);
        if (nullptr != rows.pLayout && rows.pLayout->decodes(column_value)) {
            pjRecArray->append(rows.pLayout->record(column_value));
            return 0;
        }
    }
    Json::Value jTmp(Json::objectValue);
    if (FAILED(0 > DbCallBackFillRec(&jTmp, n_column, column_value, column_name))) return -1;
    pjRecArray->append(std::move(jTmp));
    if (nullptr == rows.pLayout) rows.pLayout = newLayout(*rows.pTable, nColumns, column_name);
    return 0;
}

}  // namespace

int DbCallBackFillList(void* arg, int n_column, char** column_value, char** column_name)
{
    try {
        return fillList(static_cast<Json::Value*>(arg), n_column, column_value, column_name);
    } catch (...) {
        ofThisThread<Rows>().pThrown = std::current_exception();
        return -1;
    }
}

void beginStatement(const std::string& strTable)
{
    Rows& rows = ofThisThread<Rows>();
    rows.pLayout = nullptr;
    if (nullptr != rows.pTable && rows.strCurJsonName == strTable) return;
    std::string strName = strTable;
    const auto it = rows.tables.try_emplace(strTable).first;
    rows.strCurJsonName.swap(strName);
    rows.pTable = &it->second;
    if (kMaxTables >= rows.tables.size()) return;
    const auto next = std::next(it);
    rows.tables.erase(rows.tables.end() == next ? rows.tables.begin() : next);
}

std::exception_ptr takeThrown()
{
    return std::exchange(ofThisThread<Rows>().pThrown, nullptr);
}

}  // namespace vorn
