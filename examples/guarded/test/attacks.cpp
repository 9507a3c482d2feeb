// SPDX-License-Identifier: MIT
#include "attacks.h"

#include "aims.h"

using namespace aims;

namespace {

std::string operation(const char* szName, const std::string& strRest)
{
    return std::string(R"({"op":")") + szName + "\"," + strRest + "}";
}

std::string list(const std::string& strRequest)
{
    return operation("list", R"("request":)" + strRequest);
}

std::string filter(const std::string& strFilter)
{
    return list(R"({"vornSqlWhereFilter":")" + strFilter + R"("})");
}

std::string remove(const std::string& strRequest)
{
    return operation("delete", R"("request":)" + strRequest);
}

std::string create(const std::string& strRecord)
{
    return operation("create", R"("record":)" + strRecord);
}

std::string save(const std::string& strRecord)
{
    return operation("save", R"("record":)" + strRecord);
}

std::string update(const std::string& strRequest, const std::string& strValues)
{
    return operation("update", R"("request":)" + strRequest + R"(,"values":)" + strValues);
}

std::string repeated(unsigned uTimes, const std::string& strText)
{
    std::string strAll;
    for (unsigned i = 0; i < uTimes; ++i) strAll += strText;
    return strAll;
}

std::string nested(unsigned uLevels)
{
    return create(R"({"id":7,"topics":)" + std::string(uLevels, '[') + std::string(uLevels, ']') +
                  "}");
}

constexpr auto kStops = Attack::Fence::kStops;
constexpr auto kLetsThrough = Attack::Fence::kLetsThrough;

// A note that is there already, so that the call fails.
Attack logged(const char* szName, const std::string& strText)
{
    return {
        szName, {create(R"({"id":1,"text":")" + strText + "\"}")}, logHasControls, kLetsThrough};
}

std::vector<Attack> rawFilters()
{
    return {
        {"raw_filter_deletes_all",
         {remove(R"({"id":1,"vornSqlWhereFilter":"1 or 1"})")},
         everyNoteIsDeleted,
         kStops},
        {"raw_filter_other_record",
         {remove(R"({"vornSqlWhereFilter":"id=2"})")},
         noteTwoIsDeleted,
         kLetsThrough},
        {"raw_filter_stacked", {filter("1); delete from vault; --")}, vaultIsEmpty, kStops},
        {"raw_filter_drop", {filter("1); drop table vault; --")}, vaultIsGone, kStops},
        {"raw_filter_union",
         {filter("0) union select secret,0,1,'x','[]' from vault --")},
         secretIsTold,
         kStops},
        {"raw_filter_subselect",
         {filter("(select secret from vault) like 's3%'")},
         answersTheQuestion,
         kStops},
        {"raw_filter_pragma",
         {filter("1); pragma query_only=1; --")},
         connectionIsReadOnly,
         kStops},
        {"raw_filter_transaction", {filter("1); begin; --")}, transactionIsOpen, kStops},
        {"raw_filter_insert",
         {filter("1); insert into note (id,text) values (7,'forged'); --")},
         noteIsForged,
         kStops},
        {"raw_filter_time",
         {filter("exists (select 1 from note a, note b, note c where a.id+b.id+c.id < 0)")},
         sqliteIsBusy,
         kStops,
         Attack::Guard::kRefuses,
         150},
    };
}

std::vector<Attack> numbers()
{
    return {
        {"number_text_deletes_all", {remove(R"({"id":"0 or 1"})")}, everyNoteIsDeleted, kStops},
        {"number_text_stacked",
         {list(R"({"id":"1); delete from vault; --"})")},
         vaultIsEmpty,
         kStops},
        {"number_text_update",
         {update(R"({"id":"1); delete from vault; --"})", R"({"done":true})")},
         vaultIsEmpty,
         kStops},
        {"number_text_get",
         {operation("get", R"x("request":{"id":"0) union select secret,0,1,1,1 from vault --"})x")},
         secretIsTold,
         kStops},
        {"number_text_tells_all", {list(R"({"id":"0 or 1"})")}, everyNoteIsTold, kLetsThrough},
        {"number_text_in_list",
         {list(R"({"id":["1)); delete from vault; --"]})")},
         vaultIsEmpty,
         kStops},
        {"bool_text_in_list",
         {list(R"({"done":["1)); delete from vault; --"]})")},
         vaultIsEmpty,
         kStops},
        {"number_beyond_64_bits",
         {create(R"({"id":18446744073709551615})")},
         hostIsThrownAt,
         kLetsThrough},
        {"number_text_in_record", {save(R"({"id":"seven"})")}, hostIsThrownAt, kLetsThrough},
        {"bool_text_in_request", {list(R"({"done":"yes"})")}, hostIsThrownAt, kLetsThrough},
    };
}

std::vector<Attack> pages()
{
    return {
        {"limit_text",
         {list(R"({"limit":"1\" is null; delete from vault; --"})")},
         vaultIsEmpty,
         kStops},
        {"offset_text",
         {list(R"({"limit":1,"offset":"1\" is null; delete from vault; --"})")},
         vaultIsEmpty,
         kStops},
        {"limit_negative",
         {list(R"({"limit":-1})")},
         thousandsAreTold,
         kStops,
         Attack::Guard::kRefuses,
         20000},
        {"limit_huge",
         {list(R"({"limit":1000000})")},
         thousandsAreTold,
         kStops,
         Attack::Guard::kRefuses,
         20000},
        {"no_limit", {list("{}")}, thousandsAreTold, kStops, Attack::Guard::kLimits, 20000},
        {"sort_by_number", {list(R"({"sort_by":1})")}, hostIsThrownAt, kLetsThrough},
        {"sort_direction_object",
         {list(R"({"sort_by":"id","sort_direction":{}})")},
         hostIsThrownAt,
         kLetsThrough},
    };
}

std::vector<Attack> percents()
{
    // What follows the cut text stands outside quotes: ('x,7,' and then the text.
    const std::string strCut = R"({"author":"x%y","id":7,"text":)";
    const std::string strDelete = R"(",0,7,1,1); delete from vault; --"})";
    return {
        {"percent_cut_create", {create(strCut + strDelete)}, vaultIsEmpty, kStops},
        {"percent_cut_save", {save(strCut + strDelete)}, vaultIsEmpty, kStops},
        {"percent_cut_reads",
         {create(strCut + R"(",0,7,(select secret from vault),1) --"})"), list(R"({"id":7})")},
         secretIsTold,
         kStops},
        {"percent_s_reads",
         {create(
              R"({"id":7,"text":"%s","topics":["',(select json_array(secret) from vault)) --"]})"),
          list(R"({"id":7})")},
         secretIsTold,
         kStops},
        {"percent_update_saved_again",
         {update(R"({"id":1})", R"({"author":"x%y","text":",0,1,1,1); delete from vault; --"})"),
          kHostSavesAgain},
         vaultIsEmpty,
         kStops},
        {"percent_changes_values",
         {create(R"({"author":"50%s","id":7})")},
         authorIsAnother,
         kLetsThrough},
        {"percent_swells",
         {create(R"({"id":7,"author":")" + repeated(1000, "%4096d") + R"("})")},
         noteIsHuge,
         kStops},
    };
}

std::vector<Attack> shapes()
{
    return {
        {"request_selects_many", {remove(R"({"done":false})")}, everyNoteIsDeleted, kStops},
        {"list_of_two", {remove(R"({"id":[1,2]})")}, noteTwelveIsDeleted, kLetsThrough},
        {"undeclared_member_deletes",
         {remove(R"({"done":false,"ID":1})")},
         everyNoteIsDeleted,
         kStops},
        {"undeclared_member_tells_all",
         {list(R"({"writer":"Ann"})")},
         everyNoteIsTold,
         kLetsThrough},
        {"member_name_as_sql", {list(R"({"author='Ann' --":1})")}, everyNoteIsTold, kLetsThrough},
        {"member_name_twice", {remove(R"({"id":1,"id":2})")}, noteTwoIsDeleted, kLetsThrough},
        {"nul_in_record",
         {create(R"({"id":7,"author":"Ann\u0000, guest"})")},
         annIsImitated,
         kLetsThrough},
        {"nul_in_request", {list(R"({"author":"Ann\u0000, guest"})")}, annIsTold, kLetsThrough},
        {"depth_1001", {nested(1001)}, topicsAreLost, kLetsThrough},
        {"depth_10000", {nested(10000)}, topicsAreLost, kLetsThrough},
        {"huge_text",
         {create(R"({"id":7,"text":")" + std::string(8000000, 'x') + R"("})")},
         noteIsHuge,
         kStops},
        {"log_line",
         {create(R"({"id":1,"text":"\nroot logged in"})")},
         logLineIsForged,
         kLetsThrough},
        logged("log_next_line", "\\u0085root logged in"),
        logged("log_line_separator", "\\u2028root logged in"),
        logged("log_direction", "\\u202enimda"),
        logged("log_escape_sequence", "\\u009b2J"),
        {"not_utf8", {create("{\"author\":\"\xff\"}")}, authorIsNoUtf8, kLetsThrough},
    };
}

// Each command is a good one by itself.
std::vector<Attack> shares()
{
    const char* kGreatest = R"({"id":2147483647})";
    std::vector<std::string> hundred(100,
                                     create(R"({"text":")" + std::string(60000, 'x') + R"("})"));
    hundred.push_back(list("{}"));
    return {
        {"create_with_id", {create(kGreatest)}, idsAreUsedUp, kLetsThrough},
        {"update_of_id", {update(R"({"id":1})", kGreatest)}, idsAreUsedUp, kLetsThrough},
        {"save_with_new_id", {save(kGreatest)}, idsAreUsedUp, kLetsThrough},
        {"update_of_author",
         {update(R"({"id":1})", R"({"author":"Eve"})")},
         noteIsEves,
         kLetsThrough},
        {"save_of_other_author", {save(R"({"id":1,"author":"Eve"})")}, noteIsEves, kLetsThrough},
        // Ann goes on to change her note, which is gone.
        {"delete_and_create",
         {create(R"({"author":"Ann"})"), remove(R"({"id":13})"), create(R"({"author":"Eve"})"),
          update(R"({"id":13})", R"({"text":"Ann"})"), remove(R"({"id":14})")},
         newNoteIsChanged,
         kLetsThrough,
         Attack::Guard::kLetsThrough},
        {"notes_beyond_quota",
         {create(R"({"author":"crowd"})")},
         crowdGrows,
         kLetsThrough,
         Attack::Guard::kRefuses,
         1000},
        {"list_without_index",
         {list(R"({"text":"none"})")},
         tableIsScanned,
         kStops,
         Attack::Guard::kRefuses,
         40000},
        {"order_without_index",
         {list(R"({"sort_by":"id"})")},
         tableIsScanned,
         kStops,
         Attack::Guard::kRefuses,
         40000},
        {"many_values",
         {create(R"({"topics":[0)" + repeated(4000, ",0") + "]}")},
         noteHasManyValues,
         kLetsThrough},
        {"huge_answer", hundred, answerIsHuge, kLetsThrough},
    };
}

}  // namespace

const std::vector<Attack>& attacks()
{
    static const std::vector<Attack> all = [] {
        std::vector<Attack> made;
        for (auto* part : {rawFilters, numbers, pages, percents, shapes, shares})
            for (Attack& attack : part()) made.push_back(std::move(attack));
        return made;
    }();
    return all;
}
