// SPDX-License-Identifier: MIT
// The look-ups of member types behind every operation but recSave and recCreate, on types that are
// missing, of a wrong kind or partial: the result, the whole log and what is left in the table.

#include "support/lookups.h"
#include "support/matrix.h"
#include "support/records.h"

#include <map>
#include <utility>

namespace {

struct Arguments {
    VornJsonDbApi& api;
    std::string strFirst;
    std::string strSecond;
    Json::Value jFirst = leftByReader(strFirst);
    Json::Value jSecond = leftByReader(strSecond);
    Json::Value jText = strSecond;
    std::vector<std::string> texts = {strFirst};
    // The outputs, and what stands in them before.
    Json::Value jOut = Json::nullValue;
    std::string strOut = "(";
};

const std::map<std::string, int (*)(Arguments&)> kCalls = {
    {"recList", [](Arguments& a) { return a.api.recList(a.jFirst, a.jOut); }},
    {"recGetOne", [](Arguments& a) { return a.api.recGetOne(a.jFirst, a.jOut); }},
    {"recUpdateByFilter",
     [](Arguments& a) { return a.api.recUpdateByFilter(a.jFirst, a.jSecond); }},
    {"recUpdateByWhere",
     [](Arguments& a) { return a.api.recUpdateByWhere(a.jFirst, a.strSecond); }},
    {"recDelete", [](Arguments& a) { return a.api.recDelete(a.jFirst); }},
    {"recDeleteAll", [](Arguments& a) { return a.api.recDeleteAll(); }},
    {"recDeleteByArray",
     [](Arguments& a) { return a.api.recDeleteByArray(a.texts, a.strSecond.c_str()); }},
    {"recDeleteByName",
     [](Arguments& a) { return a.api.recDeleteByName(a.strFirst, a.strSecond.c_str()); }},
    {"fillDefaultValue",
     [](Arguments& a) {
         a.jOut = a.jFirst;
         return a.api.fillDefaultValue(a.jOut, "check" == a.strSecond);
     }},
    {"checkJsonType", [](Arguments& a) { return a.api.checkJsonType(a.jFirst); }},
    {"SqlExpandMemberName", [](Arguments& a) { return a.api.SqlExpandMemberName(a.strOut); }},
    {"SqlExpandMemberSymbol",
     [](Arguments& a) { return a.api.SqlExpandMemberSymbol(a.strOut, a.jFirst); }},
    {"SqlExpandMemberList",
     [](Arguments& a) {
         return a.api.SqlExpandMemberList(a.jFirst, a.strOut, VORN_SQL_WHERE_TYPE_AND);
     }},
    {"SqlMakeByMatchField",
     [](Arguments& a) { return a.api.SqlMakeByMatchField(a.strFirst, a.jText, a.strOut); }},
    {"SqlMakeByListField",
     [](Arguments& a) {
         return a.api.SqlMakeByListField(a.strFirst.c_str(), a.jSecond, a.strOut);
     }},
};

// In the expected lines: a look-up of the operation, and one of the row decoder, which has no
// definition. Each stands for the lines that it logs.
const char kLookUp[] = "look-up";
const char kDecoder[] = "look-up of the row decoder";

struct Case {
    const char* szCall;  // with its arguments, if any
    const char* szEnd;   // the result and the output, or "throws"
    Lines lines;
    const char* szContents = "xyz,uvw";  // of the table afterwards
};
using Cases = std::vector<Case>;

// The lines of a look-up and a check that fails.
Lines lookedUp(const std::string& strLine)
{
    return {kLookUp, strLine};
}

Lines listRefused(const std::string& strError, const std::string& strRequest,
                  const std::string& strSql)
{
    return {runFailed(strError, strSql),
            failed("0 > runSqlEx(strSqlRun, DbCallBackFillList, &jRecArrayOut)"),
            plain("jRecParam=" + strRequest), sqlError(strError, strSql)};
}

// A row whose column the decoder refuses with that line; the first column is not traced.
Lines rowRefused(const std::string& strLine, const Lines& traced, const std::string& strRequest,
                 const std::string& strSql)
{
    const char szField[] = "0 > (iTmp = DbCallBackFillField(*pjRec, column_name, column_value, i))";
    return Lines{strLine, failed(szField)} + traced +
           Lines{failed("0 > DbCallBackFillRec(&jTmp, n_column, column_value, column_name)")} +
           listRefused("query aborted", strRequest, strSql);
}

Lines updateRefused(const std::string& strError, const std::string& strValues,
                    const std::string& strSql)
{
    return {runFailed(strError, strSql), failed("0 > runSqlEx(strSql, NULL, NULL)"),
            plain("jRecIn=" + strValues), sqlError(strError, strSql)};
}

Lines filterRefused(const std::string& strCondition, const std::string& strValues)
{
    return {failed(strCondition), plain("recUpdateByFilter failed, jParamIn=" + strValues)};
}

Lines arrayRefused(const std::string& strCondition, const std::string& strKey)
{
    return {failed(strCondition),
            plain("recDeleteByArray failed, name=" + strKey + ", strVector=x")};
}

Lines nameRefused(const std::string& strCondition, const std::string& strKey)
{
    return {failed(strCondition), plain("recDeleteByName failed, name=" + strKey + ", strValue=x")};
}

const Lines kOneLookUp = {kLookUp};
const Lines kNoOne = {failed("0 > recList(jRecParam, jRecArray)")};
const std::string kNoColumn = failed("!jType.isMember(strName)");
const Lines kNoKey = lookedUp(failed("!jType.isMember(strKey)"));
const Lines kNoField = lookedUp(failed("!jType.isMember(strField)"));
const Lines kNoListField = lookedUp(failed("!jType.isMember(szField)"));
const Lines kNoCondition = lookedUp(failed("strSql.empty()"));
const char kNoMember[] = "!jType.isMember(szKey)";
const char kNoUpdate[] = "0 > recUpdateByWhere(jParamIn, strSql)";
const char kNewA[] = R"({"a":"n"})";
const char kNewB[] = R"({"b":"n"})";

// Of no types at all, beside the operations that list columns.
Cases withoutTypes()
{
    return {
        {R"(recUpdateByFilter {"a":"x"} {"a":"n"})", "-1",
         kOneLookUp + filterRefused("strSql.empty()", kNewA)},
        {R"(recUpdateByFilter {"vornSqlWhereFilter":"1"} {"a":"n"})", "-1",
         Lines{kLookUp, kLookUp, kLookUp} +
             updateRefused(kNearWhere, kNewA, "UPDATE $ SET  WHERE  ( 1  );") +
             filterRefused(kNoUpdate, kNewA)},
        {R"(recUpdateByWhere {"a":"n"} 1)", "-1",
         kOneLookUp + updateRefused(kNearWhere, kNewA, "UPDATE $ SET  WHERE 1;")},
        {"recDelete [1]", "-1", {failed("jRecParam.type() != Json::objectValue")}},
        {R"(recDelete {"a":"x"})", "-1", kNoCondition},
        {R"(recDelete {"a":"x","vornSqlWhereFilter":"a='u'"})", "1", kOneLookUp, "xyz"},
        {"recDeleteAll", "2", kOneLookUp, "NULL"},
        {"recDeleteByArray x a", "-1", kOneLookUp + arrayRefused(kNoMember, "a")},
        {"recDeleteByName x a", "-1", kOneLookUp + nameRefused(kNoMember, "a")},
        {"fillDefaultValue {}", "0 {}", kOneLookUp},
        {"fillDefaultValue {} check", "0 {}", kOneLookUp},
        {R"(checkJsonType {"a":5})", "0", kOneLookUp},
        {R"(SqlExpandMemberList {"a":"x"})", "1", kOneLookUp},
        {"SqlMakeByMatchField a x", "-1", kNoField},
        {R"(SqlMakeByListField a ["x"])", "-1", kNoListField},
    };
}

// Of no types and a definition without columns.
Cases withoutColumns()
{
    const Lines refused =
        kOneLookUp + listRefused("near \"FROM\": syntax error", R"({"a":"x"})", "SELECT  FROM $ ;");
    return {
        {R"(recList {"a":"x"})", "-1", refused},
        {R"(recGetOne {"a":"x"})", "-1", refused + kNoOne},
        {"SqlExpandMemberName", "0", {}},
        {R"(SqlExpandMemberSymbol {"a":"x"})", "0", kOneLookUp},
    };
}

// Of no types and a definition with columns: the row decoder finds none of them.
Cases withColumns()
{
    const Lines refused = Lines{kLookUp, kDecoder} +
                          rowRefused(kNoColumn, {}, R"({"a":"x"})", "SELECT a,b,c FROM $ ;");
    return {
        {R"(recList {"a":"x"})", "-1", refused},
        {R"(recGetOne {"a":"x"})", "-1", refused + kNoOne},
        {"SqlExpandMemberName", "0 (a,b,c", {}},
        {R"(SqlExpandMemberSymbol {"a":"x"})", "-1", kNoKey},
    };
}

// Of types that end before b; only the first look-up says so. What is asked of b is not asked.
Cases withPartialTypes()
{
    const Lines traced = {plain("column_name[1]=b"), plain("column_value[1]=y")};
    const Lines one = kOneLookUp + rowRefused(kNoColumn, traced, R"({"a":"x"})",
                                              "SELECT a,b,c FROM $  WHERE  (a='x' );");
    const Lines every =
        kOneLookUp + rowRefused(kNoColumn, traced, R"({"b":"-"})", "SELECT a,b,c FROM $ ;");
    const char szBadA[] = R"(type failed, strKey=a, jRecParam={"a":5,"b":5})";
    return {
        {R"(recList {"a":"x"})", "-1", one},
        {R"(recList {"b":"-"})", "-1", every},
        {R"(recList {"a":"-"})", "0", kOneLookUp},
        {R"(recList {"a":{}})", "throws", kOneLookUp},
        {R"(recGetOne {"a":"x"})", "-1", one + kNoOne},
        {R"(recGetOne {"b":"-"})", "-1", every + kNoOne},
        {R"(recUpdateByFilter {"a":"x"} {"b":"n"})", "-1",
         kOneLookUp + updateRefused(kNearWhere, kNewB, "UPDATE $ SET  WHERE  (a='x' );") +
             filterRefused(kNoUpdate, kNewB)},
        {R"(recUpdateByFilter {"b":"y"} {"a":"n"})", "-1",
         kOneLookUp + filterRefused("strSql.empty()", kNewA)},
        {R"(recUpdateByFilter {"a":"x"} {"a":"n","b":"n"})", "0", kOneLookUp, "nyz,uvw"},
        {R"(recUpdateByFilter {"a":{}} {"a":"n"})", "throws", kOneLookUp},
        {R"(recUpdateByWhere {"b":"n"} 1)", "-1",
         kOneLookUp + updateRefused(kNearWhere, kNewB, "UPDATE $ SET  WHERE 1;")},
        {R"(recUpdateByWhere {"a":"n","b":"n"} 1)", "0", kOneLookUp, "nyz,nvw"},
        {R"(recDelete {"b":"y"})", "-1", kNoCondition},
        {R"(recDelete {"a":"x","b":"-"})", "1", kOneLookUp, "uvw"},
        {R"(recDelete {"a":{}})", "throws", kOneLookUp},
        {"recDeleteAll", "2", kOneLookUp, "NULL"},
        {"recDeleteByArray x b", "-1", kOneLookUp + arrayRefused(kNoMember, "b")},
        {"recDeleteByArray x a", "1", kOneLookUp, "uvw"},
        {"recDeleteByName x b", "-1", kOneLookUp + nameRefused(kNoMember, "b")},
        {"recDeleteByName x a", "1", kOneLookUp, "uvw"},
        {"fillDefaultValue {}", R"(0 {"a":"d"})", kOneLookUp},
        {R"(fillDefaultValue {"a":"x"} check)", R"(0 {"a":"x"})", kOneLookUp},
        {"fillDefaultValue {} check", "-1 {}", lookedUp(error("lost data member=a"))},
        {R"(checkJsonType {"b":5})", "0", kOneLookUp},
        {R"(checkJsonType {"a":5,"b":5})", "-1", lookedUp(error(szBadA))},
        {"SqlExpandMemberName", "0 (a,b,c", {}},
        {R"(SqlExpandMemberSymbol {"a":"x"})", "-1", kNoKey},
        {R"(SqlExpandMemberList {"a":"x","b":"y"})", "0 ( (a='x' )", kOneLookUp},
        {R"(SqlExpandMemberList {"b":"y"})", "1", kOneLookUp},
        {"SqlMakeByMatchField b y", "-1", kNoField},
        {R"(SqlMakeByListField b ["y"])", "-1", kNoListField},
    };
}

// Of types whose a has no word, which is an unknown one.
Cases withoutAWord()
{
    const Lines row = rowRefused(error("type error, strType="), {}, R"({"b":"y"})",
                                 "SELECT a,b,c FROM $  WHERE  (b='y' );");
    const Lines noText = arrayRefused(R"(jType[szKey]["cpptype"].asString() != "string")", "a");
    const std::string strNoX = "no such column: x";
    const std::string strDelete = "DELETE FROM $  WHERE  (a=x );";
    const Lines notDeleted = {runFailed(strNoX, strDelete),
                              failed("0 > (err = runSqlEx(strSqlRun))"),
                              sqlError(strNoX, strDelete)};
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
        {R"(recDelete {"a":"x"})", "-1", notDeleted},
        {"recDeleteAll", "2", {}, "NULL"},
        {"recDeleteByArray x a", "-1", noText},
        {"recDeleteByName x a", "-1",
         noText + nameRefused("0 > (err = recDeleteByArray(strVector, szKey))", "a")},
        {"fillDefaultValue {}", "0 {}", {}},
        {"fillDefaultValue {} check", "-1 {}", {error("lost data member=a")}},
        {R"(checkJsonType {"a":"x"})", "-1", {error("type not found!!, key=a")}},
        {R"(SqlExpandMemberSymbol {"a":"x"})", "-1", {error("cannot support this type=")}},
        {R"(SqlExpandMemberSymbol {"b":"y"})", "0 ('y',", {}},
        {R"(SqlExpandMemberList {"a":"x"})", "0 ( (a=x )", {}},
        {"SqlMakeByMatchField a x", "0 (a=x", {}},
        {R"(SqlMakeByListField a ["x"])", "0 (a in (x )", {}},
    };
}

// Of types whose a has a word that is no text and has none: nothing is logged before it is thrown.
Cases withAWordThatThrows()
{
    return {
        {R"(recList {"a":"x"})", "throws", {}},
        {R"(recList {"b":"y"})", "throws", {}},
        {R"(recGetOne {"b":"y"})", "throws", {}},
        {R"(recUpdateByFilter {"a":"x"} {"b":"n"})", "throws", {}},
        {R"(recUpdateByFilter {"b":"y"} {"a":"n"})", "throws", {}},
        {R"(recUpdateByWhere {"a":"n"} 1)", "throws", {}},
        {R"(recDelete {"a":"x"})", "throws", {}},
        {"recDeleteAll", "2", {}, "NULL"},
        {"recDeleteByArray x a", "throws", {}},
        {"recDeleteByName x a", "throws", {}},
        {"fillDefaultValue {}", "0 {}", {}},
        {R"(checkJsonType {"a":"x"})", "throws", {}},
        {R"(SqlExpandMemberSymbol {"a":"x"})", "throws", {}},
        {R"(SqlExpandMemberSymbol {"b":"y"})", "0 ('y',", {}},
        {R"(SqlExpandMemberList {"a":"x"})", "throws", {}},
        {"SqlMakeByMatchField a x", "throws", {}},
        {R"(SqlMakeByListField a ["x"])", "throws", {}},
    };
}

std::string defined(const std::string& strMembers)
{
    return R"({"$":{"member":)" + strMembers + "}}";
}

std::string typesOf(const std::string& strA)
{
    return R"({"a":)" + strA + R"(,"b":{"cpptype":"string"},"c":{"cpptype":"string"}})";
}

class RequestLookUps : public LookUpsTest {
protected:
    // What a look-up logs.
    struct LookUpLines {
        Lines first, later, decoder;
    };

    // Each case on a table of its own, and once more where later look-ups log other lines. Where
    // strEntry is given, the host has put it in place of the table's types.
    void expect(const Cases& cases, const std::string& strDefinition, const LookUpLines& lookUps,
                const std::string& strEntry = "")
    {
        for (const Case& c : cases) {
            SCOPED_TRACE(std::string(c.szCall) + " on " + strDefinition);
            strName_ = freshName();
            std::string strCreate = "create table " + strName_ + " (a, b, c)";
            Json::Value jDefinition = json(named(strDefinition));
            VornJsonDbApi api(database_.get(), strName_, jDefinition, strCreate);
            takeLog();
            if (!strEntry.empty()) VORN_JSON_DB::recType(jDefinition, strName_) = json(strEntry);
            std::vector<Lines> looks = {lookUps.first};
            if (lookUps.first != lookUps.later) looks.push_back(lookUps.later);
            for (const Lines& look : looks) {
                database_.run("delete from " + strName_ + ";insert into " + strName_ +
                              " values ('x','y','z'),('u','v','w')");
                EXPECT_EQ(c.szEnd, endOf(c.szCall, api));
                EXPECT_EQ(named(expanded(c.lines, look, lookUps)), takeOwnLog());
                EXPECT_EQ(c.szContents,
                          database_.value("select group_concat(a||b||c) from " + strName_));
            }
        }
    }

    const std::string strWhole_ = defined(typesOf(R"({"cpptype":"string"})"));

private:
    static std::string endOf(const char* szCall, VornJsonDbApi& api)
    {
        std::vector<std::string> words = split(szCall, ' ');
        words.resize(3);
        try {
            Arguments arguments{api, words[1], words[2]};
            std::string strEnd = std::to_string(kCalls.at(words[0])(arguments));
            if (!arguments.jOut.isNull()) strEnd += ' ' + text(arguments.jOut);
            if ("(" != arguments.strOut) strEnd += ' ' + arguments.strOut;
            return strEnd;
        } catch (const Json::LogicError&) {
            return "throws";
        }
    }

    // The first look-up logs other lines than those behind it.
    static Lines expanded(const Lines& lines, Lines look, const LookUpLines& lookUps)
    {
        Lines out;
        for (const std::string& strLine : lines) {
            if (kLookUp == strLine)
                out = out + std::exchange(look, lookUps.later);
            else
                out = out + (kDecoder == strLine ? lookUps.decoder : Lines{strLine});
        }
        return out;
    }

    UnwatchedLog unwatched_;
};

TEST_F(RequestLookUps, WithABadDefinition)
{
    std::string strCondition;
    for (const BadDefinition& bad : kBadDefinitions) {
        const std::string strGiven = bad.szDefinition;
        const Lines first = lookUp(bad.szCondition, strGiven, "-");
        // The column list leaves the table in the handle's copy.
        expect(withoutColumns(), strGiven, {first, lookUp(kPoisoned, bad.szLater, "null"), {}});
        // One of the definitions that fail the same check tells the rest.
        if (std::exchange(strCondition, bad.szCondition) == bad.szCondition) continue;
        expect(withoutTypes(), strGiven, {first, lookUp(kPoisoned, strGiven, "null"), {}});
    }
}

TEST_F(RequestLookUps, WithTypesOfAWrongKind)
{
    for (const char* szEntry : {"null", "[{\"a\":1}]", "\"a\"", "5", "true"}) {
        const Lines look = lookUp(kPoisoned, strWhole_, szEntry);
        const LookUpLines lookUps = {look, look, lookUp(kPoisoned, "null", szEntry)};
        expect(withoutTypes(), strWhole_, lookUps, szEntry);
        expect(withColumns(), strWhole_, lookUps, szEntry);
    }
}

TEST_F(RequestLookUps, WithAMemberThatHasNoWord)
{
    const struct {
        const char* szMember;
        const char* szCondition;
    } cases[] = {{"{}", kNoWord}, {R"({"cpptype":5})", kWordIsNoText}};
    for (const auto& c : cases) {
        // The first member: no types.
        const std::string strNone = defined(typesOf(c.szMember));
        const LookUpLines lookUps = {lookUp(c.szCondition, strNone, "-"),
                                     lookUp(kPoisoned, strNone, "null"),
                                     lookUp(kPoisoned, "null", "null")};
        expect(withoutTypes(), strNone, lookUps);
        expect(withColumns(), strNone, lookUps);
        // The second one: those of the first.
        const std::string strA = R"({"a":{"cppDefaultValue":"d","cpptype":"string"})";
        const std::string strPartial =
            defined(strA + R"(,"b":)" + c.szMember + R"(,"c":{"cpptype":"string"}})");
        expect(withPartialTypes(), strPartial,
               {lookUp(c.szCondition, strPartial, strA + "}"), {}, {}});
    }
}

TEST_F(RequestLookUps, WithTypesThatLackAColumn)
{
    const struct {
        const char* szEntry;
        Lines traced;
    } cases[] = {
        {R"({"b":{"cpptype":"string"},"c":{"cpptype":"string"}})", {}},
        {R"({"a":{"cpptype":"string"},"c":{"cpptype":"string"}})",
         {plain("column_name[1]=b"), plain("column_value[1]=y")}},
        {R"({"a":{"cpptype":"string"},"b":{"cpptype":"string"}})",
         {plain("column_name[2]=c"), plain("column_value[2]=z")}},
        {"{}", {}},
    };
    for (const auto& c : cases) {
        const Lines refused = rowRefused(kNoColumn, c.traced, "null", "SELECT a,b,c FROM $ ;");
        expect({{"recList null", "-1", refused}, {"recGetOne null", "-1", refused + kNoOne}},
               strWhole_, {}, c.szEntry);
    }
}

TEST_F(RequestLookUps, WithAMemberOfAWrongKind)
{
    for (const char* szA : {"{}", "null", R"({"cpptype":null})", "5", "\"string\"", "[\"string\"]"})
        expect(withoutAWord(), strWhole_, {}, typesOf(szA));
    for (const char* szA : {R"({"cpptype":["string"]})", R"({"cpptype":{}})"})
        expect(withAWordThatThrows(), strWhole_, {}, typesOf(szA));
}

}  // namespace
