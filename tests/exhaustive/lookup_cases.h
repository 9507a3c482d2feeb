// SPDX-License-Identifier: MIT
// Calls on types that are missing, of a wrong kind or partial, and every line that each logs.
#pragma once

#include "calls.h"
#include "support/records.h"

// In the expected lines: a look-up of the operation, one before the operation has listed columns,
// and one of the row decoder, which has no definition. Each stands for the lines that it logs.
inline const std::string kLookUp = "look-up";
inline const std::string kEarlyLookUp = "look-up before the columns";
inline const std::string kDecoder = "look-up of the row decoder";

// A call on the rows xyz and uvw of the table "$" (a, b, c).
struct Case {
    std::string strCall;
    const char* szEnd;  // the result and the output, if it changes
    Lines lines;
    const char* szContents = "xyz,uvw";  // of the table afterwards
};
using Cases = std::vector<Case>;

inline Lines listRefused(const std::string& strError, const std::string& strRequest,
                         const std::string& strSql)
{
    return {runFailed(strError, strSql),
            failed("0 > runSqlEx(strSqlRun, DbCallBackFillList, &jRecArrayOut)"),
            plain("jRecParam=" + strRequest), sqlError(strError, strSql)};
}

// A row whose column the decoder refuses with that line; the first column is not traced.
inline Lines rowRefused(const std::string& strLine, const Lines& traced,
                        const std::string& strRequest, const std::string& strSql)
{
    const char szField[] = "0 > (iTmp = DbCallBackFillField(*pjRec, column_name, column_value, i))";
    return Lines{strLine, failed(szField)} + traced +
           Lines{failed("0 > DbCallBackFillRec(&jTmp, n_column, column_value, column_name)")} +
           listRefused("query aborted", strRequest, strSql);
}

inline Lines updateRefused(const std::string& strError, const std::string& strValues,
                           const std::string& strSql)
{
    return {runFailed(strError, strSql), failed("0 > runSqlEx(strSql, NULL, NULL)"),
            plain("jRecIn=" + strValues), sqlError(strError, strSql)};
}

inline Lines filterRefused(const std::string& strCondition, const std::string& strValues)
{
    return {failed(strCondition), plain("recUpdateByFilter failed, jParamIn=" + strValues)};
}

inline Lines arrayRefused(const std::string& strCondition, const std::string& strKey)
{
    return {failed(strCondition),
            plain("recDeleteByArray failed, name=" + strKey + ", strVector=x")};
}

inline Lines nameRefused(const std::string& strCondition, const std::string& strKey)
{
    return {failed(strCondition), plain("recDeleteByName failed, name=" + strKey + ", strValue=x")};
}

// A save without any column.
inline Lines emptyLists(const char* szCreate, const std::string& strVerb)
{
    const std::string strSql =
        strVerb + " INTO $ () VALUES (;select * from $ where rowid == last_insert_rowid();";
    return {runFailed(kNearParenthesis, strSql),
            failed("0 > runSqlEx(strSql, DbCallBackFillList, &jArrayTmp)"),
            plain(std::string("blCreate=") + szCreate + R"(, jRecInOut={"a":1})"),
            plain("jType=null"), sqlError(kNearParenthesis, strSql)};
}

// A save whose value list meets a column without a type.
inline Lines noValue(const std::string& strRecord, const std::string& strTypes)
{
    return {failed("!jType.isMember(strKey)"),
            failed("0 > SqlExpandMemberSymbol(strSql, jRecInOut)"),
            plain("blCreate=1, jRecInOut=" + strRecord), plain("jType=" + strTypes)};
}

inline Lines createFailed(const std::string& strRecord,
                          const std::string& strCondition = "0 > recSave(jParam, true)")
{
    return {failed(strCondition), plain("call create rec, rec=" + strRecord)};
}

inline const Lines kCreateLookUps = {kLookUp, kEarlyLookUp, kEarlyLookUp, kLookUp};
inline const Lines kNoOne = {failed("0 > recList(jRecParam, jRecArray)")};
inline const std::string kNoColumn = failed("!jType.isMember(strName)");
inline const Lines kNoKey = {kLookUp, failed("!jType.isMember(strKey)")};
inline const Lines kNoField = {kLookUp, failed("!jType.isMember(strField)")};
inline const Lines kNoListField = {kLookUp, failed("!jType.isMember(szField)")};
inline const Lines kNoCondition = {kLookUp, failed("strSql.empty()")};
inline constexpr char kNoMember[] = "!jType.isMember(szKey)";
inline constexpr char kNoUpdate[] = "0 > recUpdateByWhere(jParamIn, strSql)";
inline constexpr char kNewA[] = R"({"a":"n"})";
inline constexpr char kNewB[] = R"({"b":"n"})";

// Of no types at all, beside the operations that list columns.
inline Cases withoutTypes()
{
    return {
        {R"(recUpdateByFilter {"a":"x"} {"a":"n"})", "-1",
         Lines{kLookUp} + filterRefused("strSql.empty()", kNewA)},
        {R"(recUpdateByFilter {"vornSqlWhereFilter":"1"} {"a":"n"})", "-1",
         Lines{kLookUp, kLookUp, kLookUp} +
             updateRefused(kNearWhere, kNewA, "UPDATE $ SET  WHERE  ( 1  );") +
             filterRefused(kNoUpdate, kNewA)},
        {R"(recUpdateByWhere {"a":"n"} 1)", "-1",
         Lines{kLookUp} + updateRefused(kNearWhere, kNewA, "UPDATE $ SET  WHERE 1;")},
        {"recDelete [1]", "-1", {failed("jRecParam.type() != Json::objectValue")}},
        {R"(recDelete {"a":"x"})", "-1", kNoCondition},
        {R"(recDelete {"a":"x","vornSqlWhereFilter":"a='u'"})", "1", {kLookUp}, "xyz"},
        {"recDeleteAll", "2", {kLookUp}, "NULL"},
        {R"(recDeleteByArray ["x"] a)", "-1", Lines{kLookUp} + arrayRefused(kNoMember, "a")},
        {"recDeleteByName x a", "-1", Lines{kLookUp} + nameRefused(kNoMember, "a")},
        {"recCreate {}", "-1", createFailed("{}", "jRecIn.empty()")},
        {"recCreate [1]", "-1",
         Lines{kLookUp, kLookUp, failed("!jRecParam.isObject()")} +
             createFailed("[1]", "0 > checkJsonType(jParam)")},
        {"fillDefaultValue {} fill", "0", {kLookUp}},
        {"fillDefaultValue {} check", "0", {kLookUp}},
        {R"(checkJsonType {"a":5})", "0", {kLookUp}},
        {R"(SqlExpandMemberList {"a":"x"} before 1)", "1", {kLookUp}},
        {R"(SqlMakeByMatchField a "x")", "-1", kNoField},
        {R"(SqlMakeByListField a ["x"])", "-1", kNoListField},
    };
}

// Of no types and a definition without columns.
inline Cases withoutColumns()
{
    const Lines refused = Lines{kLookUp} + listRefused("near \"FROM\": syntax error",
                                                       R"({"a":"x"})", "SELECT  FROM $ ;");
    return {
        {R"(recSave {"a":1} insert)", "-1", Lines{kLookUp, kLookUp} + emptyLists("1", "INSERT")},
        {R"(recSave {"a":1} replace)", "-1", Lines{kLookUp, kLookUp} + emptyLists("0", "REPLACE")},
        {R"(recCreate {"a":1})", "-1",
         kCreateLookUps + emptyLists("1", "INSERT") + createFailed(R"({"a":1})")},
        {R"(recList {"a":"x"})", "-1", refused},
        {R"(recGetOne {"a":"x"})", "-1", refused + kNoOne},
        {"SqlExpandMemberName", "0", {}},
        {R"(SqlExpandMemberSymbol before {"a":"x"})", "0", {kLookUp}},
    };
}

// Of those types, which are no object, and a definition with columns: none of them is found.
inline Cases withColumns(const std::string& strTypes)
{
    const Lines refused = Lines{kLookUp, kDecoder} +
                          rowRefused(kNoColumn, {}, R"({"a":"x"})", "SELECT a,b,c FROM $ ;");
    const Lines notSaved = noValue(R"({"a":"x"})", strTypes);
    return {
        {R"(recSave {"a":"x"} insert)", "-1", Lines{kLookUp, kLookUp} + notSaved},
        {R"(recCreate {"a":"x"})", "-1", kCreateLookUps + notSaved + createFailed(R"({"a":"x"})")},
        {R"(recList {"a":"x"})", "-1", refused},
        {R"(recGetOne {"a":"x"})", "-1", refused + kNoOne},
        {"SqlExpandMemberName", "0 a,b,c", {}},
        {R"(SqlExpandMemberSymbol before {"a":"x"})", "-1", kNoKey},
    };
}

// Of types that end before b; only the first look-up says so. What is asked of b is not asked.
inline Cases withPartialTypes(const std::string& strTypes)
{
    const Lines traced = {plain("column_name[1]=b"), plain("column_value[1]=y")};
    const Lines one = Lines{kLookUp} + rowRefused(kNoColumn, traced, R"({"a":"x"})",
                                                  "SELECT a,b,c FROM $  WHERE  (a='x' );");
    const Lines every =
        Lines{kLookUp} + rowRefused(kNoColumn, traced, R"({"b":"-"})", "SELECT a,b,c FROM $ ;");
    const char szBadA[] = R"(type failed, strKey=a, jRecParam={"a":5,"b":5})";
    const char szFilled[] = R"({"a":"d","b":1,"c":2})";
    return {
        {R"(recSave {"a":"n"} insert)", "-1", Lines{kLookUp} + noValue(kNewA, strTypes)},
        {R"(recCreate {"b":1,"c":2})", "-1",
         Lines{kLookUp} + noValue(szFilled, strTypes) + createFailed(szFilled)},
        {R"(recList {"a":"x"})", "-1", one},
        {R"(recList {"b":"-"})", "-1", every},
        {R"(recList {"a":"-"})", "0", {kLookUp}},
        {R"(recList {"a":{}})", "T", {kLookUp}},
        {R"(recGetOne {"a":"x"})", "-1", one + kNoOne},
        {R"(recGetOne {"b":"-"})", "-1", every + kNoOne},
        {R"(recUpdateByFilter {"a":"x"} {"b":"n"})", "-1",
         Lines{kLookUp} + updateRefused(kNearWhere, kNewB, "UPDATE $ SET  WHERE  (a='x' );") +
             filterRefused(kNoUpdate, kNewB)},
        {R"(recUpdateByFilter {"b":"y"} {"a":"n"})", "-1",
         Lines{kLookUp} + filterRefused("strSql.empty()", kNewA)},
        {R"(recUpdateByFilter {"a":"x"} {"a":"n","b":"n"})", "0", {kLookUp}, "nyz,uvw"},
        {R"(recUpdateByFilter {"a":{}} {"a":"n"})", "T", {kLookUp}},
        {R"(recUpdateByWhere {"b":"n"} 1)", "-1",
         Lines{kLookUp} + updateRefused(kNearWhere, kNewB, "UPDATE $ SET  WHERE 1;")},
        {R"(recUpdateByWhere {"a":"n","b":"n"} 1)", "0", {kLookUp}, "nyz,nvw"},
        {R"(recDelete {"b":"y"})", "-1", kNoCondition},
        {R"(recDelete {"a":"x","b":"-"})", "1", {kLookUp}, "uvw"},
        {R"(recDelete {"a":{}})", "T", {kLookUp}},
        {"recDeleteAll", "2", {kLookUp}, "NULL"},
        {R"(recDeleteByArray ["x"] b)", "-1", Lines{kLookUp} + arrayRefused(kNoMember, "b")},
        {R"(recDeleteByArray ["x"] a)", "1", {kLookUp}, "uvw"},
        {"recDeleteByName x b", "-1", Lines{kLookUp} + nameRefused(kNoMember, "b")},
        {"recDeleteByName x a", "1", {kLookUp}, "uvw"},
        {"fillDefaultValue {} fill", R"(0 {"a":"d"})", {kLookUp}},
        {R"(fillDefaultValue {"a":"x"} check)", "0", {kLookUp}},
        {"fillDefaultValue {} check", "-1", {kLookUp, error("lost data member=a")}},
        {R"(checkJsonType {"b":5})", "0", {kLookUp}},
        {R"(checkJsonType {"a":5,"b":5})", "-1", {kLookUp, error(szBadA)}},
        {"SqlExpandMemberName", "0 a,b,c", {}},
        {R"(SqlExpandMemberSymbol before {"a":"x"})", "-1", kNoKey},
        {R"(SqlExpandMemberList {"a":"x","b":"y"} before 1)", "0  (a='x' )", {kLookUp}},
        {R"(SqlExpandMemberList {"b":"y"} before 1)", "1", {kLookUp}},
        {R"(SqlMakeByMatchField b "y")", "-1", kNoField},
        {R"(SqlMakeByListField b ["y"])", "-1", kNoListField},
    };
}

// Of types whose a has no word, which is an unknown one.
inline Cases withoutAWord()
{
    const Lines row = rowRefused(error("type error, strType="), {}, R"({"b":"y"})",
                                 "SELECT a,b,c FROM $  WHERE  (b='y' );");
    const Lines noText = arrayRefused(R"(jType[szKey]["cpptype"].asString() != "string")", "a");
    const std::string strNoX = "no such column: x";
    const std::string strDelete = "DELETE FROM $  WHERE  (a=x );";
    return {
        {R"(recList {"b":"y"})", "-1", row},
        {R"(recList {"a":"x"})", "-1",
         listRefused(strNoX, R"({"a":"x"})", "SELECT a,b,c FROM $  WHERE  (a=x );")},
        {R"(recGetOne {"b":"y"})", "-1", row + kNoOne},
        {R"(recUpdateByFilter {"b":"y"} {"a":"n"})", "-1",
         Lines{error("type not found!!, key=a")} +
             filterRefused("0 > checkJsonType(jParamIn)", kNewA)},
        {R"(recUpdateByWhere {"a":"n"} 1)", "-1",
         updateRefused("no such column: n", kNewA, "UPDATE $ SET a=n WHERE 1;")},
        {R"(recDelete {"a":"x"})",
         "-1",
         {runFailed(strNoX, strDelete), failed("0 > (err = runSqlEx(strSqlRun))"),
          sqlError(strNoX, strDelete)}},
        {"recDeleteAll", "2", {}, "NULL"},
        {R"(recDeleteByArray ["x"] a)", "-1", noText},
        {"recDeleteByName x a", "-1",
         noText + nameRefused("0 > (err = recDeleteByArray(strVector, szKey))", "a")},
        {"fillDefaultValue {} fill", "0", {}},
        {"fillDefaultValue {} check", "-1", {error("lost data member=a")}},
        {R"(checkJsonType {"a":"x"})", "-1", {error("type not found!!, key=a")}},
        {R"(SqlExpandMemberSymbol before {"a":"x"})", "-1", {error("cannot support this type=")}},
        {R"(SqlExpandMemberSymbol before {"b":"y"})", "0 'y',", {}},
        {R"(SqlExpandMemberList {"a":"x"} before 1)", "0  (a=x )", {}},
        {R"(SqlMakeByMatchField a "x")", "0 a=x", {}},
        {R"(SqlMakeByListField a ["x"])", "0 a in (x )", {}},
    };
}

// Of types whose a has a word that is no text and has none: nothing is logged before it is thrown.
inline Cases withAWordThatThrows()
{
    Cases cases = {
        {"recDeleteAll", "2", {}, "NULL"},
        {"fillDefaultValue {} fill", "0", {}},
        {R"(SqlExpandMemberSymbol before {"b":"y"})", "0 'y',", {}},
        {R"(SqlExpandMemberList {"a":"x"} before 1)", "T  (", {}},
    };
    for (const char* szCall :
         {R"(recList {"a":"x"})", R"(recList {"b":"y"})", R"(recGetOne {"b":"y"})",
          R"(recUpdateByFilter {"a":"x"} {"b":"n"})", R"(recUpdateByFilter {"b":"y"} {"a":"n"})",
          R"(recUpdateByWhere {"a":"n"} 1)", R"(recDelete {"a":"x"})",
          R"(recDeleteByArray ["x"] a)", "recDeleteByName x a", R"(checkJsonType {"a":"x"})",
          R"(SqlExpandMemberSymbol before {"a":"x"})",
          R"(SqlMakeByMatchField a "x")", R"(SqlMakeByListField a ["x"])"})
        cases.push_back({szCall, "T", {}});
    return cases;
}
