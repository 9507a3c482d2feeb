// SPDX-License-Identifier: MIT
#include "VornJsonDbApi/row_decoder.h"

#include "util/json_members.h"
#include "util/json_text.h"
#include "util/log.h"
#include "util/no_destructor.h"
#include "util/type_words.h"

#include <VornJsonDbApi.h>

#include <algorithm>
#include <climits>
#include <cstddef>
#include <cstdlib>
#include <cstring>
#include <set>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

namespace vorn {

namespace {

// What a column of the result becomes. Kept for the next statement, which checks it once.
struct Column {
    std::string_view name = "";  // NOLINT(readability-redundant-string-init): NUL at its end
    std::string strType;
    RowForm form = RowForm::kNo;
    bool blChecked = false;
};

// Where a member of the prototype comes from.
struct Source {
    std::size_t iColumn;
    const char* szName;
    RowForm form;
};

// A record with every column of the rows as a member. Copies are filled in the order of the
// members, so that none has to be searched for.
struct Prototype {
    Json::Value jRecord;
    std::vector<Source> sources;  // one for each column; empty until the columns are known
    bool blUsable = false;        // false if a column cannot be decoded or occurs twice
    bool blChecked = false;       // whether the columns have these types in the running statement
};

struct State {
    // The table whose statement is running: SQLite calls the row callback without a handle.
    std::string strCurJsonName;
    // What was thrown in the row callback; nothing may unwind through SQLite's own frames.
    std::exception_ptr pThrownInCallback;
    // The member types of that table, once a row has asked for them: the entry never moves.
    const Json::Value* pjMemberTypes = nullptr;
    std::vector<Column> columns;
    Prototype prototype;
    // Whether a row that is filled by name has come across a new column, or one whose type has
    // changed.
    bool blNewColumn = false;
};

State& state()
{
    static NoDestructor<State> instance;
    return *instance;
}

const Json::Value& memberTypes()
{
    State& current = state();
    // If it is not an object it is looked up again, which logs.
    if (nullptr == current.pjMemberTypes || !current.pjMemberTypes->isObject()) {
        // Kept(RowDecoder.SpoilsTheTypesOfATableThatNobodyAskedForBefore): a row that is decoded
        // before anybody has asked for the table's types spoils them
        Json::Value jTableDef;
        current.pjMemberTypes = &VORN_JSON_DB::recType(jTableDef, current.strCurJsonName);
    }
    return *current.pjMemberTypes;
}

// A copy of the name that is never released, so that all records can share it as their key.
std::string_view sharedName(const char* szName)
{
    static NoDestructor<std::set<std::string, std::less<>>> instance;
    auto& names = *instance;
    const auto it = names.find(std::string_view(szName));
    return *(names.end() == it ? names.emplace(szName).first : it);
}

// The column at idx, or null, after logging the failed check, if the table has no such member.
const Column* resolvedColumn(const char* szName, std::size_t idx)
{
    State& current = state();
    std::vector<Column>& columns = current.columns;
    if (columns.size() <= idx) columns.resize(idx + 1);
    Column& column = columns[idx];
    const bool blSameName = 0 == strcmp(column.name.data(), szName);
    if (blSameName && column.blChecked) return &column;

    const Json::Value* pjMember = findMember(memberTypes(), szName);
    if (FAILED_AS(nullptr == pjMember, "!jType.isMember(strName)")) return nullptr;
    std::string strType = TypeWord(*pjMember).text();
    if (!blSameName || strType != column.strType) {
        current.blNewColumn = true;
        column.blChecked = false;
        current.prototype.sources.clear();
        current.prototype.blUsable = false;
        column.name = sharedName(szName);
        column.form = formsOf(strType).row;
        column.strType = std::move(strType);
    }
    column.blChecked = true;
    return &column;
}

// Any number with this many digits fits.
constexpr int kFittingDigits = 18;

// What strtoll reads, but faster if the text is nothing but digits and fits.
long long integerOf(const char* szText)
{
    const char* szDigit = szText;
    unsigned long long uValue = 0;
    for (; '0' <= *szDigit && *szDigit <= '9'; ++szDigit)
        uValue = uValue * 10 + static_cast<unsigned char>(*szDigit - '0');
    const bool blFits = '\0' == *szDigit && kFittingDigits >= szDigit - szText;
    return blFits ? static_cast<long long>(uValue) : strtoll(szText, nullptr, 10);
}

int saturatedToInt(long long iValue)
{
    return static_cast<int>(std::clamp<long long>(iValue, INT_MIN, INT_MAX));
}

// Sets the member from its column's text; a bool is already false. Inlined, because a call would
// cost as much as most of its branches.
[[gnu::always_inline]] inline void decode(RowForm form, const char* szValue, Json::Value& jMember)
{
    // Cheaper than an assignment, which moves comments and offsets too.
    const auto set = [&jMember](Json::Value jValue) { jMember.swapPayload(jValue); };
    switch (form) {
    case RowForm::kText: set(szValue); break;
    // Kept(RowDecoder.StoresIntegersAsSigned): unsigned words are read through signed
    // conversions and saturate
    case RowForm::kInt32: set(saturatedToInt(integerOf(szValue))); break;
    case RowForm::kInt64: set(Json::Int64(integerOf(szValue))); break;
    case RowForm::kJson: fromString(szValue, jMember); break;
    case RowForm::kBool:
    case RowForm::kNo:  // which the caller has refused
        if (1 == integerOf(szValue)) set(true);
        break;
    }
}

int DbCallBackFillField(Json::Value& jRec, char** column_name, char** column_value, int idx)
{
    // Cannot fail: the record is the library's own object.
    if (GUARDED(jRec.type() != Json::objectValue && jRec.type() != Json::nullValue)) return -1;
    // Cannot fail: the loop begins at 0.
    if (GUARDED(0 > idx)) return -1;
    const Column* pColumn = resolvedColumn(column_name[idx], static_cast<std::size_t>(idx));
    if (nullptr == pColumn) return -1;

    // NULL means absent, whatever the type word.
    const char* szValue = column_value[idx];
    if (nullptr == szValue) return 0;

    if (RowForm::kNo == pColumn->form) {
        LOG_ERROR("type error, strType=%s", pColumn->strType.c_str());
        return -1;
    }
    Json::Value& jMember = jRec[Json::StaticString(pColumn->name.data())];
    if (RowForm::kBool == pColumn->form) jMember = false;
    decode(pColumn->form, szValue, jMember);
    return 0;
}

int DbCallBackFillRec(Json::Value* pjRec, int n_column, char** column_value, char** column_name)
{
    if (FAILED(NULL == column_name || NULL == column_value)) return -1;
    const auto fail = [&](int i) {
        // Kept(RowDecoder.ShowsTheFailedColumnUnlessItIsTheFirst): the first column of a bad row is
        // not traced
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

// For rows whose columns were all looked up under these names.
void makePrototype(std::size_t nColumns)
{
    const std::vector<Column>& columns = state().columns;
    Json::Value jRecord(Json::objectValue);
    std::vector<Source> sources;
    bool blDecoded = true;
    for (std::size_t i = 0; i < nColumns; ++i) {
        const Column& column = columns[i];
        const bool blFalse = RowForm::kBool == column.form;
        jRecord[Json::StaticString(column.name.data())] =
            blFalse ? Json::Value(false) : Json::Value();
        sources.push_back({i, column.name.data(), column.form});
        blDecoded = blDecoded && RowForm::kNo != column.form;
    }
    std::sort(sources.begin(), sources.end(), [&columns](const Source& left, const Source& right) {
        return columns[left.iColumn].name < columns[right.iColumn].name;
    });
    Prototype& prototype = state().prototype;
    prototype.blUsable = blDecoded && jRecord.size() == nColumns;
    prototype.blChecked = true;
    prototype.jRecord.swap(jRecord);
    prototype.sources.swap(sources);
}

// Whether the columns still have the types that they had in an earlier statement. Neither logs nor
// throws: if in doubt, the row is filled by name, which does both.
bool haveSameTypes()
{
    State& current = state();
    if (nullptr == current.pjMemberTypes) return false;
    MemberWalk types(*current.pjMemberTypes);
    for (const Source& source : current.prototype.sources) {
        Column& column = current.columns[source.iColumn];
        const Json::Value* pjMember = types.find(column.name);
        if (nullptr == pjMember || !TypeWord(*pjMember).is(column.strType)) return false;
        column.blChecked = true;
    }
    return true;
}

// Whether the row has the prototype's columns, each with a value.
bool fitsPrototype(std::size_t nColumns, char** column_value, char** column_name)
{
    Prototype& prototype = state().prototype;
    if (!prototype.blUsable || prototype.sources.size() != nColumns || nullptr == column_name ||
        nullptr == column_value)
        return false;
    for (const Source& source : prototype.sources) {
        const char* szName = column_name[source.iColumn];
        if (nullptr == column_value[source.iColumn] || nullptr == szName ||
            0 != strcmp(source.szName, szName))
            return false;
    }
    prototype.blChecked = prototype.blChecked || haveSameTypes();
    return prototype.blChecked;
}

// The prototype has at least one column.
Json::Value recordFromPrototype(char** column_value)
{
    const Prototype& prototype = state().prototype;
    Json::Value jRec = prototype.jRecord;
    const Source* pSource = prototype.sources.data();
    const Source* const pEnd = pSource + prototype.sources.size();
    for (auto it = jRec.begin();; ++it) {
        decode(pSource->form, column_value[pSource->iColumn], *it);
        if (++pSource == pEnd) return jRec;
    }
}

// Kept(RowDecoder.AppendsTheRowsOfEveryAttempt, RowDecoder.KeepsTheRowsBeforeAFailure): rows are
// appended to the array, also by every retried attempt, and those before a failure stay
int fillList(Json::Value* pjRecArray, int n_column, char** column_value, char** column_name)
{
    if (FAILED(!pjRecArray)) return -1;
    if (FAILED(pjRecArray->type() != Json::arrayValue && pjRecArray->type() != Json::nullValue))
        return -1;
    const auto nColumns = static_cast<std::size_t>(std::max(0, n_column));
    if (fitsPrototype(nColumns, column_value, column_name)) {
        pjRecArray->append(recordFromPrototype(column_value));
        return 0;
    }
    State& current = state();
    Json::Value jTmp(Json::objectValue);
    current.blNewColumn = false;
    if (FAILED(0 > DbCallBackFillRec(&jTmp, n_column, column_value, column_name))) return -1;
    pjRecArray->append(std::move(jTmp));
    if (!current.blNewColumn && current.prototype.sources.size() != nColumns)
        makePrototype(nColumns);
    return 0;
}

}  // namespace

int DbCallBackFillList(void* arg, int n_column, char** column_value, char** column_name)
{
    try {
        return fillList(static_cast<Json::Value*>(arg), n_column, column_value, column_name);
    } catch (...) {
        state().pThrownInCallback = std::current_exception();
        return -1;
    }
}

void beginStatement(const std::string& strTable)
{
    State& current = state();
    if (current.strCurJsonName != strTable) {
        current.pjMemberTypes = nullptr;
        current.strCurJsonName = strTable;
    }
    current.prototype.blChecked = false;
    for (Column& column : current.columns) column.blChecked = false;
}

std::exception_ptr takeThrown()
{
    return std::exchange(state().pThrownInCallback, nullptr);
}

}  // namespace vorn
