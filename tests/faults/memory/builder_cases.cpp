// SPDX-License-Identifier: MIT
// The SQL builders. Text that they append to begins with "begin (" in each case.

#include "cases.h"

namespace {

int SqlExpandMemberName(Call& call)
{
    return call.api->SqlExpandMemberName(call.strText);
}

int SqlExpandMemberNameOfRecord(Call& call)
{
    return call.api->SqlExpandMemberName(call.strText, &call.jFirst);
}

int SqlExpandMemberSymbol(Call& call)
{
    return call.api->SqlExpandMemberSymbol(call.strText, call.jFirst);
}

int SqlExpandMemberListOr(Call& call)
{
    return call.api->SqlExpandMemberList(call.jFirst, call.strText, VORN_SQL_WHERE_TYPE_OR);
}

int SqlExpandMemberListAnd(Call& call)
{
    return call.api->SqlExpandMemberList(call.jFirst, call.strText, VORN_SQL_WHERE_TYPE_AND);
}

int SqlExpandMemberListComma(Call& call)
{
    return call.api->SqlExpandMemberList(call.jFirst, call.strText, VORN_SQL_WHERE_TYPE_COMMA);
}

int SqlExpandMemberListOfNoKind(Call& call)
{
    return call.api->SqlExpandMemberList(call.jFirst, call.strText, 3);
}

int SqlMakeByMatchField(Call& call)
{
    return call.api->SqlMakeByMatchField(call.strKey, call.jFirst, call.strText);
}

int SqlMakeByListField(Call& call)
{
    return call.api->SqlMakeByListField(call.strKey.c_str(), call.jFirst, call.strText);
}

int VectorParamToJson(Call& call)
{
    return call.api->VectorParamToJson(call.strVector, call.strKey.c_str(), call.jFirst);
}

int SqlFilterConditionFromJson(Call& call)
{
    return call.api->SqlFilterConditionFromJson(call.jFirst, call.strText);
}

}  // namespace

// clang-format off
const Cases kBuilderCases = {
    {"SqlExpandMemberName", SqlExpandMemberName,
     R"j({"text": "begin ("})j",
     R"j({"text": "begin (any,big,data,flag,id,name,rate,tags", "grows": "thrown"})j"},
    {"SqlExpandMemberName of a record", SqlExpandMemberNameOfRecord,
     R"j({"first": {"id": 4, "name": "Dora", "undeclared": 1}, "text": "begin ("})j",
     R"j({"text": "begin (id,name,"})j"},
    {"SqlExpandMemberName of a table that is not defined", SqlExpandMemberName,
     R"j({"name": "undefined", "text": "begin ("})j",
     R"j({})j"},
    {"SqlExpandMemberSymbol", SqlExpandMemberSymbol,
     R"j({"name": "words", "text": "begin (",
         "first": {"a": "O'Brien of a name that is not short", "b": -5, "c": 4000000000, "d": 18446744073709551615,
                   "e": 0.5, "f": 1.25, "g": [1, "x"]}})j",
     R"j({"text": "begin ('O''Brien of a name that is not short',-5,4000000000,18446744073709551615,0.500000,1.250000,'[1,\"x\"]') "})j"},
    {"SqlExpandMemberSymbol of percent signs", SqlExpandMemberSymbol,
     R"j({"name": "words", "text": "begin (", "first": {"a": "50% of it, 5 %d, %s, %%, %5.2f and more", "b": 7, "g": []}})j",
     R"j({"text": "begin ('507f it, 5 0, , ) "})j"},
    {"SqlExpandMemberSymbol has no literal for a member", SqlExpandMemberSymbol,
     R"j({"text": "begin (", "first": {"any": {"key": "a text that is not short"}}})j",
     R"j({"result": -1})j"},
    {"SqlExpandMemberSymbol of a definition that ends early", SqlExpandMemberSymbol,
     R"j({"name": "partial", "text": "begin (", "first": {"a": 1, "b": 2}})j",
     R"j({"result": -1})j"},
    {"VectorParamToJson", VectorParamToJson,
     R"j({"vector": ["a text that is not short", "x"], "key": "name", "first": {"id": 1}})j",
     R"j({"first": {"id": 1, "name": ["a text that is not short", "x"]}})j"},
    {"VectorParamToJson into nothing", VectorParamToJson,
     R"j({"vector": ["a text that is not short", "x"], "key": "name", "first": null})j",
     R"j({"first": {"name": ["a text that is not short", "x"]}, "grows": "thrown"})j"},
    {"VectorParamToJson into a list", VectorParamToJson,
     R"j({"vector": ["a text that is not short"], "key": "name", "first": [1]})j",
     R"j({"result": -1})j"},
    {"VectorParamToJson without a key", VectorParamToJson,
     R"j({"vector": ["a text that is not short"], "key": "", "first": {"id": 1}})j",
     R"j({"result": -1})j"},
    {"SqlFilterConditionFromJson", SqlFilterConditionFromJson,
     R"j({"text": "begin (", "first": {"sort_by": "O'Brien of a name that is not short", "sort_direction": "desc", "limit": 10, "offset": "a text that is not short"}})j",
     R"j({"text": "begin ( order by 'O''Brien of a name that is not short' DESC LIMIT 10 OFFSET \"a text that is not short\"", "grows": "thrown"})j"},
    {"SqlFilterConditionFromJson of a wrong kind", SqlFilterConditionFromJson,
     R"j({"text": "begin (", "first": ["a text that is not short"]})j",
     R"j({"result": -1})j"},
};

const Cases kTermCases = {
    {"SqlExpandMemberList joined by or", SqlExpandMemberListOr,
     R"j({"text": "begin (", "first": {"flag": true, "name": ["a text that is not short"], "vornSqlWhereFilter": "id > 1 and id < 1000"}})j",
     R"j({"text": "begin ( (flag=1 or name in ('a text that is not short' ) or  id > 1 and id < 1000  )", "grows": "refused"})j"},
    {"SqlExpandMemberList joined by and", SqlExpandMemberListAnd,
     R"j({"text": "begin (", "first": {"data": {"key": "a text that is not short"}, "id": 5, "undeclared": 1}})j",
     R"j({"text": "begin ( (data='{\"key\":\"a text that is not short\"}' and id=5 )", "grows": "refused"})j"},
    {"SqlExpandMemberList joined by commas", SqlExpandMemberListComma,
     R"j({"text": "begin (", "first": {"big": 5, "name": "O'Brien of a name that is not short"}})j",
     R"j({"text": "begin (big=5 , name='O''Brien of a name that is not short'", "grows": "refused"})j"},
    {"SqlExpandMemberList of nothing", SqlExpandMemberListAnd,
     R"j({"text": "begin (", "first": {"undeclared": 1}})j",
     R"j({"result": 1})j"},
    {"SqlExpandMemberList of a wrong kind", SqlExpandMemberListAnd,
     R"j({"text": "begin (", "first": ["a text that is not short"]})j",
     R"j({"result": -1})j"},
    {"SqlExpandMemberList joined by nothing", SqlExpandMemberListOfNoKind,
     R"j({"text": "begin (", "first": {"name": "a text that is not short"}})j",
     R"j({"result": -1})j"},
    {"SqlExpandMemberList of a filter that is no text", SqlExpandMemberListAnd,
     R"j({"text": "begin (", "first": {"name": "a text that is not short", "vornSqlWhereFilter": 1}})j",
     R"j({"result": -1, "text": "begin ( (name='a text that is not short' and ", "grows": "refused"})j"},
    {"SqlMakeByMatchField of text", SqlMakeByMatchField,
     R"j({"key": "name", "first": "O'Brien of a name that is not short", "text": "begin ("})j",
     R"j({"text": "begin (name='O''Brien of a name that is not short'"})j"},
    {"SqlMakeByMatchField of JSON", SqlMakeByMatchField,
     R"j({"key": "tags", "first": ["a text that is not short", 1], "text": "begin ("})j",
     R"j({"text": "begin (tags='[\"a text that is not short\",1]'"})j"},
    {"SqlMakeByMatchField of a truth", SqlMakeByMatchField,
     R"j({"key": "flag", "first": true, "text": "begin ("})j",
     R"j({"text": "begin (flag=1"})j"},
    {"SqlMakeByMatchField of a number", SqlMakeByMatchField,
     R"j({"key": "big", "first": 9007199254740993, "text": "begin ("})j",
     R"j({"text": "begin (big=9007199254740993"})j"},
    {"SqlMakeByMatchField of no member", SqlMakeByMatchField,
     R"j({"key": "a key that is not declared", "first": 1, "text": "begin ("})j",
     R"j({"result": -1})j"},
    {"SqlMakeByMatchField of an object as text", SqlMakeByMatchField,
     R"j({"key": "name", "first": {"a": 1}, "text": "begin ("})j",
     R"j({"result": "Json::LogicError"})j"},
    {"SqlMakeByListField of texts", SqlMakeByListField,
     R"j({"key": "name", "first": ["O'Brien of a name that is not short", "x"], "text": "begin ("})j",
     R"j({"text": "begin (name in ('O''Brien of a name that is not short''x' )"})j"},
    {"SqlMakeByListField of JSON", SqlMakeByListField,
     R"j({"key": "data", "first": [{"key": "a text that is not short"}], "text": "begin ("})j",
     R"j({"text": "begin (data in ('{\"key\":\"a text that is not short\"}' )"})j"},
    {"SqlMakeByListField of numbers", SqlMakeByListField,
     R"j({"key": "id", "first": [5, 6], "text": "begin ("})j",
     R"j({"text": "begin (id in (56 )"})j"},
    {"SqlMakeByListField of nothing", SqlMakeByListField,
     R"j({"key": "name", "first": [], "text": "begin ("})j",
     R"j({})j"},
    {"SqlMakeByListField of no list", SqlMakeByListField,
     R"j({"key": "name", "first": "a text that is not short", "text": "begin ("})j",
     R"j({"result": -1})j"},
    {"SqlMakeByListField of no member", SqlMakeByListField,
     R"j({"key": "a key that is not declared", "first": [1], "text": "begin ("})j",
     R"j({"result": -1})j"},
};
// clang-format on
