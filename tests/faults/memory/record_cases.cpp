// SPDX-License-Identifier: MIT
// The record operations.

#include "cases.h"
#include "store.h"

namespace {

int recSave(Call& call)
{
    return call.api->recSave(call.jFirst, true);
}

int recReplace(Call& call)
{
    return call.api->recSave(call.jFirst, false);
}

int recCreate(Call& call)
{
    return call.api->recCreate(call.jFirst, call.jSecond);
}

int recList(Call& call)
{
    return call.api->recList(call.jFirst, call.jSecond);
}

int recGetOne(Call& call)
{
    return call.api->recGetOne(call.jFirst, call.jSecond);
}

int recUpdateByWhere(Call& call)
{
    return call.api->recUpdateByWhere(call.jFirst, call.strText);
}

int recUpdateByFilter(Call& call)
{
    return call.api->recUpdateByFilter(call.jFirst, call.jSecond);
}

int recDelete(Call& call)
{
    return call.api->recDelete(call.jFirst);
}

int recDeleteOrAll(Call& call)
{
    return call.api->recDelete(call.jFirst, true);
}

int recDeleteAll(Call& call)
{
    return call.api->recDeleteAll();
}

int recDeleteByArray(Call& call)
{
    return call.api->recDeleteByArray(call.strVector, call.strKey.c_str());
}

int recDeleteByName(Call& call)
{
    return call.api->recDeleteByName(call.strText, call.strKey.c_str());
}

}  // namespace

// clang-format off
const Cases kSaveCases = {
    {"recSave inserts", recSave,
     R"({"first": {"big": 9007199254740993, "data": {"key": "a text that is not short"}, "id": 4, "name": "Dora", "tags": []}})",
     R"({"first": {"big": 9007199254740993, "data": {"key": "a text that is not short"}, "flag": true, "id": 4, "name": "Dora", "tags": []},
         "rows": "1 Ann 1 {k:[x]} [1,true],2 Bob 0,3 O'Brien 1,4 Dora 1 {key:a text that is not short} [] 9007199254740993"})"},
    {"recSave replaces", recReplace,
     R"({"first": {"flag": false, "id": 2, "name": "Bert", "tags": ["x", null]}})",
     R"({"rows": "1 Ann 1 {k:[x]} [1,true],2 Bert 0 [x,null],3 O'Brien 1"})"},
    {"recSave replaces two rows by one", recReplace,
     R"({"first": {"flag": true, "id": 2, "name": "Ann", "tags": []}})",
     R"({"rows": "2 Ann 1 [],3 O'Brien 1"})"},
    {"recSave has no literal for a member", recSave,
     R"({"first": {"any": 1, "id": 4, "tags": []}})",
     R"({"result": -1})"},
    {"recSave meets a text under an integer", recSave,
     R"({"first": {"id": "a text that is not short", "tags": []}})",
     R"({"result": "Json::LogicError"})"},
    {"recSave is refused by a key", recSave,
     R"({"first": {"id": 1, "name": "Dora", "tags": []}})",
     R"({"result": -1})"},
    {"recSave is refused for its list that does not close", recSave,
     R"({"first": {"id": 4, "name": "Dora"}})",
     R"({"result": -1})"},
    {"recSave cannot read back what it wrote", recSave,
     R"({"first": {"id": 4, "name": "Dora", "rate": 1.5, "tags": []}})",
     R"({"result": -1, "rows": "1 Ann 1 {k:[x]} [1,true],2 Bob 0,3 O'Brien 1,4 Dora 1 [] 1.5"})"},
    {"recSave writes nothing", recSave,
     R"({"sql": "create trigger ignore before insert on task begin select raise(ignore); end",
         "first": {"id": 4, "name": "Dora", "tags": []}})",
     R"({"result": -1})"},
    {"recCreate fills and inserts", recCreate,
     R"({"first": {"id": 4, "data": {"key": "a text that is not short"}}, "second": "before"})",
     R"({"second": {"data": {"key": "a text that is not short"}, "flag": true, "id": 4, "name": "somebody without a name of his own", "tags": [1, 2]},
         "rows": "1 Ann 1 {k:[x]} [1,true],2 Bob 0,3 O'Brien 1,4 somebody without a name of his own 1 {key:a text that is not short} [1,2]"})"},
    {"recCreate of a long text", recCreate,
     R"({"first": {"id": 4, "name": "Dora", "tags": )" LONG_LIST R"(}, "second": "before"})",
     R"({"second": {"flag": true, "id": 4, "name": "Dora", "tags": )" LONG_LIST R"(},
         "rows": "1 Ann 1 {k:[x]} [1,true],2 Bob 0,3 O'Brien 1,4 Dora 1 )" LONG_LIST R"("})"},
    {"recCreate of a record that lacks no default", recCreate,
     R"({"first": {"id": 4, "data": {"key": "a text that is not short"}, "name": "Dora", "tags": []}, "second": "before"})",
     R"({"second": {"data": {"key": "a text that is not short"}, "flag": true, "id": 4, "name": "Dora", "tags": []},
         "rows": "1 Ann 1 {k:[x]} [1,true],2 Bob 0,3 O'Brien 1,4 Dora 1 {key:a text that is not short} []"})"},
    {"recCreate of a wrong type in a record that lacks no default", recCreate,
     R"({"first": {"id": "a text that is not short", "name": "Dora", "tags": []}, "second": "before"})",
     R"({"result": -1})"},
    {"recCreate is refused by a key, with no default lacking", recCreate,
     R"({"first": {"id": 4, "name": "Ann", "tags": []}, "second": "before"})",
     R"({"result": -1, "message": "DUPLICATE_PRIMARY_KEY"})"},
    {"recCreate of nothing", recCreate,
     R"({"first": {}, "second": "before"})",
     R"({"result": -1})"},
    {"recCreate of a wrong type", recCreate,
     R"({"first": {"id": 4, "name": ["a text that is not short"]}, "second": "before"})",
     R"({"result": -1})"},
    {"recCreate of a number that is too large", recCreate,
     R"({"first": {"id": 4, "big": 18446744073709551615}, "second": "before"})",
     R"({"result": "Json::LogicError"})"},
    {"recCreate is refused by a key", recCreate,
     R"({"first": {"id": 4, "name": "Ann"}, "second": "before"})",
     R"({"result": -1, "message": "DUPLICATE_PRIMARY_KEY"})"},
};

const Cases kListCases = {
    {"recList of everything", recList,
     R"({"first": null, "second": null})",
     R"({"second": [{"data": {"k": ["x"]}, "flag": true, "id": 1, "name": "Ann", "tags": [1, true]},
                    {"flag": false, "id": 2, "name": "Bob"}, {"flag": true, "id": 3, "name": "O'Brien"}],
         "grows": "refused"})"},
    {"recList of rows alike", recList,
     R"({"name": "plain", "first": {}, "second": [1]})",
     R"({"second": [1, {"data": {"n": 1}, "id": 1, "name": "the first of the rows alike"},
                    {"data": {"n": 2}, "id": 2, "name": "the second of the rows alike"},
                    {"data": {"n": )" LONG_LIST R"(}, "id": 3, "name": "the third of the rows alike"}],
         "grows": "refused"})"},
    {"recList by everything", recList,
     R"({"first": {"flag": true, "name": ["O'Brien"], "vornSqlWhereFilter": "id > 0 and id < 1000000",
                   "sort_by": "name", "sort_direction": "desc", "limit": 10, "offset": 0},
         "second": []})",
     R"({"second": [{"flag": true, "id": 3, "name": "O'Brien"}], "grows": "refused"})"},
    {"recList for a request of a wrong kind", recList,
     R"({"first": "a text that is not short", "second": []})",
     R"({"result": -1})"},
    {"recList into an object", recList,
     R"({"first": {"name": "a text that is not short"}, "second": {"before": 1}})",
     R"({"result": -1})"},
    {"recList by a filter that is no text", recList,
     R"({"first": {"vornSqlWhereFilter": {"a member": 1}}, "second": null})",
     R"({"result": -1})"},
    {"recList sorted by no text", recList,
     R"({"first": {"sort_by": 1}, "second": null})",
     R"({"result": "Json::LogicError"})"},
    {"recList is refused", recList,
     R"({"first": {"vornSqlWhereFilter": "there is no such column"}, "second": null})",
     R"({"result": -1})"},
    {"recList ends at a row that cannot be read", recList,
     R"({"sql": "update task set rate = 'fast' where id = 2", "first": null, "second": null})",
     R"({"result": -1, "second": [{"data": {"k": ["x"]}, "flag": true, "id": 1, "name": "Ann", "tags": [1, true]}],
         "grows": "refused"})"},
    {"recGetOne finds", recGetOne,
     R"({"first": {"id": 1}, "second": null})",
     R"({"result": 1, "second": {"data": {"k": ["x"]}, "flag": true, "id": 1, "name": "Ann", "tags": [1, true]}})"},
    {"recGetOne merges", recGetOne,
     R"({"first": {"id": 1}, "second": {"a member that is kept": "a text that is not short", "flag": 5}})",
     R"({"result": 1, "second": {"a member that is kept": "a text that is not short", "data": {"k": ["x"]}, "flag": true,
                                 "id": 1, "name": "Ann", "tags": [1, true]},
         "grows": "thrown"})"},
    {"recGetOne finds nothing", recGetOne,
     R"({"first": {"id": 9}, "second": {"before": 1}})",
     R"({})"},
    {"recGetOne cannot merge", recGetOne,
     R"({"first": {"id": 1}, "second": "before"})",
     R"({"result": -1})"},
    {"recGetOne is refused", recGetOne,
     R"({"first": {"vornSqlWhereFilter": "there is no such column"}, "second": {"before": 1}})",
     R"({"result": -1})"},
};

const Cases kUpdateCases = {
    {"recUpdateByWhere", recUpdateByWhere,
     R"({"first": {"data": {"key": "a text that is not short"}, "flag": false, "vornSqlWhereFilter": "no column"}, "text": "id > 1"})",
     R"({"rows": "1 Ann 1 {k:[x]} [1,true],2 Bob 0 {key:a text that is not short},3 O'Brien 0 {key:a text that is not short}"})"},
    {"recUpdateByWhere without a condition", recUpdateByWhere,
     R"({"first": {"name": "a text that is not short"}, "text": ""})",
     R"({"result": -1})"},
    {"recUpdateByWhere of nothing", recUpdateByWhere,
     R"({"first": {}, "text": "id = 1"})",
     R"({"result": -1})"},
    {"recUpdateByWhere of a list", recUpdateByWhere,
     R"({"first": ["a text that is not short"], "text": "id = 1"})",
     R"({"result": -1})"},
    {"recUpdateByWhere is refused", recUpdateByWhere,
     R"({"first": {"name": "a text that is not short"}, "text": "there is no such column"})",
     R"({"result": -1})"},
    {"recUpdateByFilter", recUpdateByFilter,
     R"({"first": {"flag": true, "vornSqlWhereFilter": "id < 3"}, "second": {"big": 7, "name": "a name that is not short"}})",
     R"({"rows": "1 a name that is not short 1 {k:[x]} [1,true] 7,2 Bob 0,3 O'Brien 1"})"},
    {"recUpdateByFilter that selects by nothing", recUpdateByFilter,
     R"({"first": {"undeclared": 1}, "second": {"name": "a text that is not short"}})",
     R"({"result": -1})"},
    {"recUpdateByFilter of a wrong type", recUpdateByFilter,
     R"({"first": {"id": 1}, "second": {"name": ["a text that is not short"]}})",
     R"({"result": -1})"},
    {"recUpdateByFilter is refused by a key", recUpdateByFilter,
     R"({"first": {"id": 2}, "second": {"name": "Ann"}})",
     R"({"result": -1, "message": "DUPLICATE_PRIMARY_KEY"})"},
    {"recUpdateByFilter is refused", recUpdateByFilter,
     R"({"first": {"vornSqlWhereFilter": "there is no such column"}, "second": {"name": "Ann"}})",
     R"({"result": -1})"},
};

const Cases kDeleteCases = {
    {"recDelete", recDelete,
     R"({"first": {"flag": true, "vornSqlWhereFilter": "id < 100000"}})",
     R"({"result": 2, "rows": "2 Bob 0"})"},
    {"recDelete of everything", recDeleteOrAll,
     R"({"first": {}})",
     R"({"result": 3, "rows": ""})"},
    {"recDelete that selects by nothing", recDelete,
     R"({"first": {"undeclared": 1}})",
     R"({"result": -1})"},
    {"recDelete by a request of a wrong kind", recDelete,
     R"({"first": ["a text that is not short"]})",
     R"({"result": -1})"},
    {"recDelete is refused", recDelete,
     R"({"first": {"vornSqlWhereFilter": "there is no such column"}})",
     R"({"result": -1})"},
    {"recDeleteAll", recDeleteAll,
     R"({})",
     R"({"result": 3, "rows": ""})"},
    {"recDeleteAll of a table that is not there", recDeleteAll,
     R"({"sql": "drop table if exists made", "name": "made"})",
     R"({"result": -1})"},
    {"recDeleteByArray", recDeleteByArray,
     R"({"vector": ["O'Brien"], "key": "name"})",
     R"({"result": 1, "rows": "1 Ann 1 {k:[x]} [1,true],2 Bob 0"})"},
    {"recDeleteByArray of nothing", recDeleteByArray,
     R"({"vector": [], "key": "name"})",
     R"({"result": -1})"},
    {"recDeleteByArray by a member that is no text", recDeleteByArray,
     R"({"vector": ["a text that is not short", "another that is not short"], "key": "id"})",
     R"({"result": -1})"},
    {"recDeleteByArray by no member", recDeleteByArray,
     R"({"vector": ["a text that is not short"], "key": "a key that is not declared"})",
     R"({"result": -1})"},
    {"recDeleteByArray is refused", recDeleteByArray,
     R"({"sql": "create trigger refuse before delete on task begin select raise(abort, 'no'); end", "vector": ["Ann"], "key": "name"})",
     R"({"result": -1})"},
    {"recDeleteByName", recDeleteByName,
     R"({"text": "Ann", "key": "name"})",
     R"({"result": 1, "rows": "2 Bob 0,3 O'Brien 1"})"},
    {"recDeleteByName of nothing", recDeleteByName,
     R"({"text": "", "key": "name"})",
     R"({"result": -1})"},
    {"recDeleteByName by no member", recDeleteByName,
     R"({"text": "a text that is not short", "key": "a key that is not declared"})",
     R"({"result": -1})"},
    {"recDeleteByName is refused", recDeleteByName,
     R"({"sql": "create trigger refuse before delete on task begin select raise(abort, 'no'); end", "text": "Ann", "key": "name"})",
     R"({"result": -1})"},
};
// clang-format on
