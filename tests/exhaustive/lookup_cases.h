// SPDX-License-Identifier: MIT
// Calls on types that are missing, of the wrong kind or partial, and every line that each logs.
#pragma once

#include "calls.h"
#include "support/records.h"

#include <map>

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
    Lines lines;                 // up to the failed check; kAfter tells what follows
    const char* szRows = kRows;  // of the table afterwards
    // The statement that SQLite refuses, and why.
    std::string strSql = "";
    std::string strError = kNearWhere;
};
using Cases = std::vector<Case>;

// Parts of the lines below; those with a "!" appear only for a refused statement.
inline const std::string kRefused = "!statement";
inline const std::string kError = "!error";
inline const Lines kListed = {kRefused,
                              failed("0 > runSqlEx(strSqlRun, DbCallBackFillList, &jRecArrayOut)"),
                              plain("jRecParam=<1>"), kError};
inline const std::string kUpdated = failed("0 > runSqlEx(strSql, NULL, NULL)");
inline const std::string kSaved = failed("0 > runSqlEx(strSql, DbCallBackFillList, &jArrayTmp)");
inline const std::string kCreated = plain("call create rec, rec=<1>");

// What each operation logs after the failed check or statement. <1> is an argument; recCreate gets
// its record with the defaults as its second one.
inline const std::map<std::string, Lines> kAfter = {
    {"recList", kListed},
    {"recGetOne", kListed + Lines{failed("0 > recList(jRecParam, jRecArray)")}},
    {"recDelete", {kRefused, "!" + failed("0 > (err = runSqlEx(strSqlRun))"), kError}},
    {"recDeleteByArray", {plain("recDeleteByArray failed, name=<2>, strVector=x")}},
    {"recDeleteByName", {plain("recDeleteByName failed, name=<2>, strValue=x")}},
    {"recUpdateByWhere", {kRefused, kUpdated, plain("jRecIn=<1>"), kError}},
    {"recUpdateByFilter",
     {kRefused, "!" + kUpdated, "!" + plain("jRecIn=<2>"), kError,
      "!" + failed("0 > recUpdateByWhere(jParamIn, strSql)"),
      plain("recUpdateByFilter failed, jParamIn=<2>")}},
    {"recSave",
     {kRefused, "!" + kSaved, plain("blCreate=<2>, jRecInOut=<1>"), plain("jType=<types>"),
      kError}},
    {"recCreate",
     {kRefused, "!" + kSaved, plain("blCreate=1, jRecInOut=<2>"), plain("jType=<types>"), kError,
      failed("0 > recSave(jParam, true)"), plain("call create rec, rec=<2>")}},
    {"recCreate {}", {kCreated}},
    {"recCreate [1]", {kCreated}},
};

// Every line that the call logs when it finds those types.
inline Lines linesOf(const Case& c, const std::string& strCall, const std::string& strTypes)
{
    std::map<std::string, std::string> texts = {{"<types>", strTypes}};
    const std::vector<std::string> words = split(strCall, ' ');
    for (std::size_t i = 1; i < words.size(); ++i) texts["<" + std::to_string(i) + ">"] = words[i];
    if ("recSave" == words[0]) texts["<2>"] = "insert" == words[2] ? "1" : "0";
    const auto own = kAfter.find(strCall);
    const auto after = kAfter.end() == own ? kAfter.find(words[0]) : own;
    Lines lines = c.lines;
    if (kAfter.end() == after || '-' != c.szEnd[0]) return lines;
    for (std::string strLine : after->second) {
        if ('!' == strLine[0] && c.strSql.empty()) continue;
        if (kRefused == strLine) strLine = runFailed(c.strError, c.strSql);
        if (kError == strLine) strLine = sqlError(c.strError, c.strSql);
        if ('!' == strLine[0]) strLine.erase(0, 1);
        for (const auto& [strName, strText] : texts)
            if (const std::size_t n = strLine.find(strName); std::string::npos != n)
                strLine.replace(n, strName.size(), strText);
        lines.push_back(strLine);
    }
    return lines;
}

// A row whose column the decoder refuses with that line; the first column is not traced.
inline Lines rowRefused(const std::string& strLine, const Lines& traced = {})
{
    const char szField[] = "0 > (iTmp = DbCallBackFillField(*pjRec, column_name, column_value, i))";
    return Lines{strLine, failed(szField)} + traced +
           Lines{failed("0 > DbCallBackFillRec(&jTmp, n_column, column_value, column_name)")};
}

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
    {R"(recCreate {"a":1} {"a":1})", "-1", kCreate, kRows, "INSERT" + kInto, kNearParenthesis},
    {R"(recList {"a":"x"}|recGetOne {"a":"x"})", "-1", kFound, kRows, "SELECT  FROM $ ;",
     "near \"FROM\": syntax error"},
    {"SqlExpandMemberName", "0", {}},
    {R"(SqlExpandMemberSymbol before {"a":"x"})", "0", kFound},
};

// With types that are not an object and a definition with columns: none of them is found.
inline const Cases kWithColumns = {
    {R"(recSave {"a":"x"} insert)", "-1", kSave + Lines{kNoKey, kNoValue}},
    {R"(recCreate {"a":"x"} {"a":"x"})", "-1", kCreate + Lines{kNoKey, kNoValue}},
    {R"(recList {"a":"x"}|recGetOne {"a":"x"})", "-1",
     Lines{kLookUp, kDecoder} + rowRefused(kNoColumn), kRows, kSelect, kAborted},
    {"SqlExpandMemberName", "0 a,b,c", {}},
    {R"(SqlExpandMemberSymbol before {"a":"x"})", "-1", {kLookUp, kNoKey}},
};

// With types that end before b; only the first look-up says so. Checks on b are not made.
inline const Lines kRefusedB =
    kFound + rowRefused(kNoColumn, {plain("column_name[1]=b"), plain("column_value[1]=y")});
inline const Cases kWithPartialTypes = {
    {R"(recSave {"a":"n"} insert|recCreate {"b":1,"c":2} {"a":"d","b":1,"c":2})", "-1",
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
    {R"(recList {"b":"y"}|recGetOne {"b":"y"})", "-1", rowRefused(error("type error, strType=")),
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
