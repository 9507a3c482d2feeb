// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// Calls on types that are missing, of the wrong kind or partial, and every line that each logs.
#pragma once

#include "support/matrix.h"
#include "support/records.h"

// In the expected lines: a look-up of the operation, one before the operation has listed columns,
// and one of the row decoder, which has no definition. Each stands for the lines that it logs.
inline const std::string kLookUp = "look-up";
inline const std::string kEarlyLookUp = "look-up before the columns";
inline const std::string kDecoder = "look-up of the row decoder";

inline constexpr char kRows[] = "xyz,uvw";

// Calls, each on its own, on those rows of the table "$" (a, b, c).
struct Case {
    std::string strCalls;        // between bars
    const char* szEnd;           // the result and the output, if it changes
    Lines lines;                 // up to the failed check
    const char* szRows = kRows;  // of the table afterwards
    // The statement that SQLite refuses, and why.
    std::string strSql = "";
    std::string strError = kNearWhere;
};
using Cases = std::vector<Case>;

inline constexpr char kNoX[] = "no such column: x";
inline constexpr char kAborted[] = "query aborted";
inline constexpr char kSelect[] = "SELECT a,b,c FROM $ ;";
inline const std::string kNoColumn = failed("!jType.isMember(strName)");
inline const std::string kNoKey = failed("!jType.isMember(strKey)");
inline const std::string kNoValue = failed("0 > SqlExpandMemberSymbol(strSql, jRecInOut)");
inline const Lines kFound = {kLookUp};
inline const Lines kNoMember = {kLookUp, failed("!jType.isMember(szKey)")};
inline const Lines kNoField = {kLookUp, failed("!jType.isMember(strField)")};
inline const Lines kNoListField = {kLookUp, failed("!jType.isMember(szField)")};
inline const Lines kNoCondition = {kLookUp, failed("strSql.empty()")};
inline const Lines kSave = {kLookUp, kLookUp};
inline const Lines kRefusedA = rowRefused(fieldFailed(kNoColumn));
inline const Lines kCreate = {kLookUp, kEarlyLookUp, kEarlyLookUp, kLookUp};

// clang-format off

// With no types at all, except for the operations that list columns.
inline const Cases kWithoutTypes = {
    {R"(recUpdateByFilter {"a":"x"} {"a":"n"}|recDelete {"a":"x"})", "-1", kNoCondition},
    {R"(recUpdateByFilter {"vornSqlWhereFilter":"1"} {"a":"n"})", "-1",
     {kLookUp, kLookUp, kLookUp}, kRows, "UPDATE $ SET  WHERE  ( 1  );"},
    {R"(recUpdateByWhere {"a":"n"} 1)", "-1", kFound, kRows, "UPDATE $ SET  WHERE 1;"},
    {"recDelete [1]", "-1", {failed("jRecParam.type() != Json::objectValue")}},
    {R"(recDelete {"a":"x","vornSqlWhereFilter":"a='u'"})", "1", kFound, "xyz"},
    {"recDeleteAll", "2", kFound, "NULL"},
    {R"(recDeleteByArray ["x"] a|recDeleteByName x a)", "-1", kNoMember},
    {"recCreate {}", "-1", {failed("jRecIn.empty()")}},
    {"recCreate [1]", "-1",
     {kLookUp, kLookUp, failed("!jRecParam.isObject()"), failed("0 > checkJsonType(jParam)")}},
    {R"(fillDefaultValue {} fill|fillDefaultValue {} check|checkJsonType {"a":5})", "0", kFound},
    {R"(SqlExpandMemberList {"a":"x"} before 1)", "1", kFound},
    {R"(SqlMakeByMatchField a "x")", "-1", kNoField},
    {R"(SqlMakeByListField a ["x"])", "-1", kNoListField},
};

// With no types and a definition without columns.
inline const std::string kInto =
    " INTO $ () VALUES (;select * from $ where rowid == last_insert_rowid();";
inline const Cases kWithoutColumns = {
    {R"(recSave {"a":1} insert)", "-1", kSave, kRows, "INSERT" + kInto, kNearParenthesis},
    {R"(recSave {"a":1} replace)", "-1", kSave, kRows, "REPLACE" + kInto, kNearParenthesis},
    {R"(recCreate {"a":1})", "-1", kCreate, kRows, "INSERT" + kInto, kNearParenthesis},
    {R"(recList {"a":"x"}|recGetOne {"a":"x"})", "-1", kFound, kRows, "SELECT  FROM $ ;",
     "near \"FROM\": syntax error"},
    {"SqlExpandMemberName", "0", {}},
    {R"(SqlExpandMemberSymbol before {"a":"x"})", "0", kFound},
};

// With types that are not an object and a definition with columns: none of them is found.
inline const Cases kWithColumns = {
    {R"(recSave {"a":"x"} insert)", "-1", kSave + Lines{kNoKey, kNoValue}},
    {R"(recCreate {"a":"x"})", "-1", kCreate + Lines{kNoKey, kNoValue}},
    {R"(recList {"a":"x"}|recGetOne {"a":"x"})", "-1",
     Lines{kLookUp, kDecoder} + kRefusedA, kRows, kSelect, kAborted},
    {"SqlExpandMemberName", "0 a,b,c", {}},
    {R"(SqlExpandMemberSymbol before {"a":"x"})", "-1", {kLookUp, kNoKey}},
};

// With types that end before b; only the first look-up says so. Checks on b are not made.
inline const Lines kRefusedB =
    kFound + rowRefused(fieldFailed(kNoColumn), {plain("column_name[1]=b"), plain("column_value[1]=y")});
inline const Cases kWithPartialTypes = {
    {R"(recSave {"a":"n"} insert|recCreate {"b":1,"c":2})", "-1",
     {kLookUp, kNoKey, kNoValue}},
    {R"(SqlExpandMemberSymbol before {"a":"x"})", "-1", {kLookUp, kNoKey}},
    {R"(recList {"a":"x"}|recGetOne {"a":"x"})", "-1", kRefusedB, kRows,
     "SELECT a,b,c FROM $  WHERE  (a='x' );", kAborted},
    {R"(recList {"b":"-"}|recGetOne {"b":"-"})", "-1", kRefusedB, kRows, kSelect, kAborted},
    {R"(recList {"a":"-"}|fillDefaultValue {"a":"x"} check|checkJsonType {"b":5})", "0", kFound},
    {R"(recList {"a":{}}|recUpdateByFilter {"a":{}} {"a":"n"}|recDelete {"a":{}})", "T", kFound},
    {R"(recUpdateByFilter {"a":"x"} {"b":"n"})", "-1", kFound, kRows,
     "UPDATE $ SET  WHERE  (a='x' );"},
    {R"(recUpdateByFilter {"b":"y"} {"a":"n"}|recDelete {"b":"y"})", "-1", kNoCondition},
    {R"(recUpdateByFilter {"a":"x"} {"a":"n","b":"n"})", "0", kFound, "nyz,uvw"},
    {R"(recUpdateByWhere {"b":"n"} 1)", "-1", kFound, kRows, "UPDATE $ SET  WHERE 1;"},
    {R"(recUpdateByWhere {"a":"n","b":"n"} 1)", "0", kFound, "nyz,nvw"},
    {R"(recDelete {"a":"x","b":"-"}|recDeleteByArray ["x"] a|recDeleteByName x a)", "1", kFound,
     "uvw"},
    {"recDeleteAll", "2", kFound, "NULL"},
    {R"(recDeleteByArray ["x"] b|recDeleteByName x b)", "-1", kNoMember},
    {"fillDefaultValue {} fill", R"(0 {"a":"d"})", kFound},
    {"fillDefaultValue {} check", "-1", {kLookUp, error("lost data member=a")}},
    {R"(checkJsonType {"a":5,"b":5})", "-1",
     {kLookUp, error(R"(type failed, strKey=a, jRecParam={"a":5,"b":5})")}},
    {"SqlExpandMemberName", "0 a,b,c", {}},
    {R"(SqlExpandMemberList {"a":"x","b":"y"} before 1)", "0  (a='x' )", kFound},
    {R"(SqlExpandMemberList {"b":"y"} before 1)", "1", kFound},
    {R"(SqlMakeByMatchField b "y")", "-1", kNoField},
    {R"(SqlMakeByListField b ["y"])", "-1", kNoListField},
};

// With types whose a has no word, which counts as an unknown one.
inline const std::string kNoText = failed(R"(jType[szKey]["cpptype"].asString() != "string")");
inline const std::string kNoCheck = error("type not found!!, key=a");
inline const Cases kWithoutAWord = {
    {R"(recList {"b":"y"}|recGetOne {"b":"y"})", "-1", rowRefused(fieldFailed(error("type error, strType="))),
     kRows, "SELECT a,b,c FROM $  WHERE  (b='y' );", kAborted},
    {R"(recList {"a":"x"})", "-1", {}, kRows, "SELECT a,b,c FROM $  WHERE  (a=x );", kNoX},
    {R"(recUpdateByFilter {"b":"y"} {"a":"n"})", "-1",
     {kNoCheck, failed("0 > checkJsonType(jParamIn)")}},
    {R"(recUpdateByWhere {"a":"x"} 1)", "-1", {}, kRows, "UPDATE $ SET a=x WHERE 1;", kNoX},
    {R"(recDelete {"a":"x"})", "-1", {}, kRows, "DELETE FROM $  WHERE  (a=x );", kNoX},
    {"recDeleteAll", "2", {}, "NULL"},
    {R"(recDeleteByArray ["x"] a)", "-1", {kNoText}},
    {"recDeleteByName x a", "-1",
     {kNoText, plain("recDeleteByArray failed, name=a, strVector=x"),
      failed("0 > (err = recDeleteByArray(strVector, szKey))")}},
    {"fillDefaultValue {} fill", "0", {}},
    {"fillDefaultValue {} check", "-1", {error("lost data member=a")}},
    {R"(checkJsonType {"a":"x"})", "-1", {kNoCheck}},
    {R"(SqlExpandMemberSymbol before {"a":"x"})", "-1", {error("cannot support this type=")}},
    {R"(SqlExpandMemberSymbol before {"b":"y"})", "0 'y',", {}},
    {R"(SqlExpandMemberList {"a":"x"} before 1)", "0  (a=x )", {}},
    {R"(SqlMakeByMatchField a "x")", "0 a=x", {}},
    {R"(SqlMakeByListField a ["x"])", "0 a in (x )", {}},
};

// With types whose a has a word that cannot be read as text: it throws before anything is logged.
inline const Cases kWithAWordThatThrows = {
    {R"(recList {"a":"x"}|recList {"b":"y"}|recGetOne {"b":"y"}|recDelete {"a":"x"}|)"
     R"(recUpdateByFilter {"a":"x"} {"b":"n"}|recUpdateByFilter {"b":"y"} {"a":"n"}|)"
     R"(recUpdateByWhere {"a":"n"} 1|recDeleteByArray ["x"] a|recDeleteByName x a|)"
     R"(checkJsonType {"a":"x"}|SqlExpandMemberSymbol before {"a":"x"}|)"
     R"(SqlMakeByMatchField a "x"|SqlMakeByListField a ["x"])", "T",
     {}},
    {"recDeleteAll", "2", {}, "NULL"},
    {"fillDefaultValue {} fill", "0", {}},
    {R"(SqlExpandMemberSymbol before {"b":"y"})", "0 'y',", {}},
    {R"(SqlExpandMemberList {"a":"x"} before 1)", "T  (", {}},
};
// clang-format on
