// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
#include "attacks.h"

#include <algorithm>
#include <sstream>

namespace {

using Aim = std::function<bool(World& world)>;

// The query gives 1.
Aim holds(const char* szQuery)
{
    return [szQuery](World& world) { return "1" == world.database.value(szQuery); };
}

Aim isLogged(const char* szText)
{
    return [szText](World&) {
        const auto& log = doubles::state().log;
        return std::any_of(log.begin(), log.end(), [szText](const doubles::LogRecord& record) {
            return std::string::npos != record.strText.find(szText);
        });
    };
}

// The first answer lists more records than that.
Aim listsMoreThan(unsigned uRecords)
{
    return [uRecords](World& world) { return uRecords < world.answers.at(0)["records"].size(); };
}

// SQLite took more steps than that.
Aim takesMoreThan(long long iSteps)
{
    return [iSteps](World& world) { return iSteps < world.iSteps; };
}

// An answer contains the text.
Aim tells(const char* szText)
{
    return [szText](World& world) {
        return std::any_of(world.answers.begin(), world.answers.end(),
                           [szText](const Json::Value& jAnswer) {
                               return std::string::npos != text(jAnswer).find(szText);
                           });
    };
}

const Aim kVaultIsEmpty = holds("select count(*) = 0 from vault");
const Aim kVaultIsGone = holds("select count(*) = 0 from sqlite_master where name = 'vault'");
const Aim kEveryNoteIsDeleted = holds("select count(*) = 0 from note");
const Aim kNoteTwoIsDeleted = holds("select count(*) = 0 from note where id = 2");
const Aim kNoteIsHuge = holds("select count(*) from note where length(body) > 4000000");
const Aim kIdsAreUsedUp = holds("select max(id) = 2147483647 from note");
const Aim kNoteIsEves = holds("select count(*) from note where id = 1 and author = 'Eve'");
const Aim kSecretIsTold = tells("s3cr3t");

bool connectionIsReadOnly(World& world)
{
    const bool blReadOnly = "1" == world.database.value("pragma query_only");
    world.database.run("pragma query_only=0");
    return blReadOnly;
}

bool hostIsThrownAt(World& world)
{
    return world.blThrown;
}

// The call succeeded, and the member is null.
bool topicsAreLost(World& world)
{
    const Json::Value& jAnswer = world.answers.at(0);
    return 0 == jAnswer["result"].asInt() && jAnswer["record"].isMember("topics") &&
           jAnswer["record"]["topics"].isNull();
}

std::string filter(const std::string& strFilter)
{
    return list(R"({"vornSqlWhereFilter":")" + strFilter + R"("})");
}

// A note that is there already, so that the call fails.
std::string failing(const std::string& strText)
{
    return create(R"({"id":1,"body":")" + strText + "\"}");
}

std::string nested(unsigned uLevels)
{
    return create(R"({"topics":)" + std::string(uLevels, '[') + std::string(uLevels, ']') + "}");
}

std::vector<Attack> made()
{
    const char* kGreatest = R"({"id":2147483647})";
    const std::string strLarge = create(R"({"body":")" + std::string(60000, 'x') + R"("})") + "\n";
    // What follows the cut body is outside of quotes: 'x,' and then the title.
    const std::string strCut = R"({"body":"x%y","title":)";
    const std::string strDelete = R"(",0,1,1); delete from vault; --"})";
    return {
        {"raw_filter_deletes_all", erase(R"({"id":1,"vornSqlWhereFilter":"1 or 1"})"),
         kEveryNoteIsDeleted},
        {"raw_filter_other_record", erase(R"({"vornSqlWhereFilter":"id=2"})"), kNoteTwoIsDeleted},
        {"raw_filter_stacked", filter("1); delete from vault; --"), kVaultIsEmpty},
        {"raw_filter_drop", filter("1); drop table vault; --"), kVaultIsGone},
        {"raw_filter_union", filter("0) union select secret,'x',0,1,'x','[]' from vault --"),
         kSecretIsTold},
        {"raw_filter_subselect", filter("(select secret from vault) like 's3%'"), listsMoreThan(0)},
        {"raw_filter_pragma", filter("1); pragma query_only=1; --"), connectionIsReadOnly},
        {"raw_filter_transaction", filter("1); begin; --"),
         [](World& world) { return world.blTransaction; }},
        {"raw_filter_insert", filter("1); insert into note (id,body) values (7,'forged'); --"),
         holds("select count(*) from note where body = 'forged'")},
        {"raw_filter_time",
         filter("exists (select 1 from note a, note b, note c where a.id+b.id+c.id < 0)"),
         takesMoreThan(10000000), 150},
        {"number_text_deletes_all", erase(R"({"id":"0 or 1"})"), kEveryNoteIsDeleted},
        {"number_text_tells_all", list(R"({"id":"0 or 1"})"), listsMoreThan(2)},
        {"number_text_stacked", list(R"({"id":"1); delete from vault; --"})"), kVaultIsEmpty},
        {"number_text_update", update(R"({"id":"1); delete from vault; --"})", R"({"done":true})"),
         kVaultIsEmpty},
        {"number_text_get", get(R"x({"id":"0) union select secret,0,1,1,1,1 from vault --"})x"),
         kSecretIsTold},
        {"number_text_in_list", list(R"({"id":["1)); delete from vault; --"]})"), kVaultIsEmpty},
        {"number_text_in_record", save(R"({"id":"seven"})"), hostIsThrownAt},
        {"number_beyond_64_bits", save(R"({"id":18446744073709551615})"), hostIsThrownAt},
        {"bool_text_in_list", list(R"({"done":["1)); delete from vault; --"]})"), kVaultIsEmpty},
        {"bool_text_in_request", list(R"({"done":"yes"})"), hostIsThrownAt},
        {"list_of_two", erase(R"({"id":[1,2]})"),
         holds("select count(*) = 0 from note where id = 12")},
        {"limit_text", list("{}", R"({"limit":"1\" is null; delete from vault; --"})"),
         kVaultIsEmpty},
        {"offset_text", list("{}", R"({"limit":1,"offset":"1\" is null; delete from vault; --"})"),
         kVaultIsEmpty},
        {"limit_negative", list("{}", R"({"limit":-1})"), listsMoreThan(100), 20000},
        {"limit_huge", list("{}", R"({"limit":1000000})"), listsMoreThan(100), 20000},
        {"no_limit", list("{}"), listsMoreThan(100), 20000},
        {"sort_by_number", list("{}", R"({"sort":[1]})"), hostIsThrownAt},
        {"sort_direction_object", list("{}", R"({"sort":["id"],"sort_direction":{}})"),
         hostIsThrownAt},
        {"percent_cut_create", create(strCut + strDelete), kVaultIsEmpty},
        {"percent_cut_save",
         save(R"({"body":"x%y","id":3,"title":",0,3,1,1); delete from vault; --"})"),
         kVaultIsEmpty},
        {"percent_cut_reads",
         create(strCut + R"(",0,(select secret from vault),1) --"})") + "\n" + list("{}"),
         kSecretIsTold},
        {"percent_s_reads",
         create(R"({"title":"%s","topics":["',(select json_array(secret) from vault)) --"]})") +
             "\n" + list("{}"),
         kSecretIsTold},
        {"percent_update_saved_again",
         update(R"({"id":3})", R"({"body":"x%y","title":",0,3,1,1); delete from vault; --"})") +
             "\n" + kHostSavesAgain,
         kVaultIsEmpty},
        {"percent_swells", create(R"({"body":")" + repeated(1000, "%4096d") + R"("})"),
         kNoteIsHuge},
        {"percent_changes_values", create(R"({"body":"50%s","title":"x"})"),
         holds("select count(*) from note where body like '50%' and body <> '50%s'")},
        {"nul_in_record", create(R"({"body":"first\u0000, guest"})"),
         holds("select count(*) = 2 from note where body = 'first'")},
        {"nul_in_request", list(R"({"body":"third\u0000, guest"})"), listsMoreThan(0)},
        {"not_utf8", create("{\"body\":\"\xff\"}"),
         holds("select count(*) from note where hex(body) = 'FF'")},
        {"log_line", failing("\\nroot logged in"), isLogged("\nroot logged in")},
        {"log_next_line", failing("\\u0085root logged in"), isLogged("\u0085")},
        {"log_line_separator", failing("\\u2028root logged in"), isLogged("\u2028")},
        {"log_direction", failing("\\u202enimda"), isLogged("\u202e")},
        {"log_escape_sequence", failing("\\u009b2J"), isLogged("\u009b")},
        {"depth_1001", nested(1001), topicsAreLost},
        {"depth_10000", nested(10000), topicsAreLost},
        {"request_selects_many", erase(R"({"done":false})"), kEveryNoteIsDeleted},
        {"undeclared_member_deletes", erase(R"({"done":false,"ID":1})"), kEveryNoteIsDeleted},
        {"undeclared_member_tells_all", list(R"({"writer":"Ann"})"), listsMoreThan(2)},
        {"undeclared_operator_tells_all", list(R"({"$or":[{"author":"Ann"},{"id":1}]})"),
         tells("first")},
        {"member_name_as_sql", list(R"({"author='Ann' --":1})"), listsMoreThan(2)},
        {"member_name_twice", erase(R"({"id":1,"id":2})"), kNoteTwoIsDeleted},
        {"list_without_index", list(R"({"body":"none"})"), takesMoreThan(100000), 40000},
        {"order_without_index", list("{}", R"({"sort":["body"],"limit":1})"), takesMoreThan(100000),
         40000},
        {"create_with_id", create(kGreatest), kIdsAreUsedUp},
        {"update_of_id", update(R"({"id":3})", kGreatest), kIdsAreUsedUp},
        {"save_with_new_id", save(kGreatest), kIdsAreUsedUp},
        {"update_of_author", update(R"({"id":1})", R"({"author":"Eve"})"), kNoteIsEves},
        {"save_of_other_author", save(R"({"id":1,"author":"Eve"})"), kNoteIsEves},
        {"save_of_other_note", save(R"({"id":1,"body":"x"})"), kNoteIsEves},
        // Ann goes on to change her note, which is gone.
        {"delete_and_create",
         kAnn + create("{}") + "\n" + kAnn + erase(R"({"id":13})") + "\n" + create("{}") + "\n" +
             kAnn + update(R"({"id":13})", R"({"body":"Ann"})"),
         holds("select count(*) from note where author = 'Eve' and body = 'Ann'")},
        {"notes_beyond_quota", create("{}"),
         holds("select count(*) = 1001 from note where author = 'Eve'"), 999},
        {"many_values", create(R"({"topics":[0)" + repeated(4000, ",0") + "]}"),
         [](World& world) { return 3000 < world.answers.at(0)["record"]["topics"].size(); }},
        {"huge_text", create(R"({"body":")" + std::string(8000000, 'x') + R"("})"), kNoteIsHuge},
        {"huge_answer", repeated(100, strLarge) + list("{}"),
         [](World& world) { return 5000000 < text(world.answers.back()).size(); }},
    };
}

void addTexts(const Json::Value& jValue, std::set<std::string>& texts)
{
    if (jValue.isString()) texts.insert(jValue.asString());
    for (auto it = jValue.begin(); it != jValue.end(); ++it) {
        if (jValue.isObject()) texts.insert(it.name());
        addTexts(*it, texts);
    }
}

}  // namespace

const std::vector<Attack>& attacks()
{
    static const std::vector<Attack> all = made();
    return all;
}

std::set<std::string> attackTexts()
{
    std::set<std::string> texts;
    for (const Attack& attack : attacks()) {
        std::istringstream stream(attack.strLines);
        for (std::string strLine; std::getline(stream, strLine);)
            if ('{' == strLine[0]) addTexts(readAnything(strLine), texts);
    }
    return texts;
}
