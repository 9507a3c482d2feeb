// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// Random conditions, orders and pages, compared with prepared statements that are written apart
// from the table: with bound values, other SQL for each operator, and pages cut from the whole.
// evaluate.py judges them, too, in the file that VORN_FRONT_ANSWERS names.
#include "front/front.h"
#include "front/oracle_tables.h"
#include "front/random.h"

#include <fstream>

namespace {

// A condition, and the oracle's SQL of it with the values that are bound to it.
struct Asked {
    Json::Value jCondition{Json::objectValue};
    std::string strSql = "1";
    std::vector<Json::Value> bound = {};
};

class Oracle : public FrontTest {
protected:
    Oracle()
    {
        database_.run("pragma journal_mode=memory");
        if (const char* szAnswers = getenv("VORN_FRONT_ANSWERS")) answers_.open(szAnswers);
    }

    // Few different values, so that conditions find something and orders have ties.
    Json::Value value(const std::string& strMember)
    {
        if ("big" == strMember)
            return draws_.once(9) ? std::numeric_limits<Json::Int64>::min()
                                  : Json::Int64(draws_.below(5)) * 3000000000;
        if ("num" == strMember) return static_cast<int>(draws_.below(5)) - 2;
        if ("flag" == strMember) return draws_.once(2);
        if ("id" == strMember) return Json::Int64(draws_.below(2 * kRows));
        if ("doc" == strMember && draws_.once(2))
            return docs_[static_cast<Json::ArrayIndex>(draws_.below(docs_.size()))];
        return draws_.of(kTexts);
    }

    std::string pattern()
    {
        std::string strPattern;
        for (std::size_t n = draws_.below(5); 0 < n; --n) strPattern += draws_.of(kPieces);
        return strPattern;
    }

    void fill(Front& front, const char* szColumns)
    {
        Json::Value jLine;
        jLine["members"] = json(kMembers);
        jLine["columns"] = szColumns;
        for (int i = 0; i < kRows; ++i) {
            Json::Value jRecord;
            for (const std::string& strMember : names_)
                if ("id" == strMember || "big" == strMember || "code" == strMember ||
                    !draws_.once(4))
                    jRecord[strMember] = value(strMember);
            jRecord["id"] = i;
            ASSERT_EQ("0", front.create(jRecord));
            jLine["records"].append(jRecord);
        }
        answers_ << text(jLine) << "\n";
    }

    std::string bind(Asked& asked, const Json::Value& jValue)
    {
        asked.bound.push_back(jValue);
        return "?";
    }

    Json::Value bindable(const std::string& strMember, const Json::Value& jValue)
    {
        return "doc" == strMember ? Json::Value(text(jValue)) : jValue;
    }

    void addTerm(Asked& asked, const std::string& strMember)
    {
        static const std::vector<std::pair<const char*, const char*>> kOrders = {
            {"$gt", ">"}, {"$gte", ">="}, {"$lt", "<"}, {"$lte", "<="}};
        const bool blOrdered = "doc" != strMember && "flag" != strMember;
        const bool blText = "name" == strMember || "code" == strMember;
        Json::Value& jTerm = asked.jCondition[strMember];
        const Json::Value jValue = value(strMember);
        std::string strSql;
        switch (draws_.below(blText ? 9 : blOrdered ? 8 : 6)) {
        case 0:
            jTerm = Json::Value();
            strSql = strMember + " isnull";
            break;
        case 1:
            jTerm["$ne"] = Json::Value();
            strSql = strMember + " notnull";
            break;
        case 2:
            if (jValue.isObject() || draws_.once(2))
                jTerm["$eq"] = jValue;
            else
                jTerm = jValue;
            strSql = "ifnull(" + strMember + "=" + bind(asked, bindable(strMember, jValue)) + ",0)";
            break;
        case 3:
            jTerm["$ne"] = jValue;
            strSql =
                "ifnull(" + strMember + "<>" + bind(asked, bindable(strMember, jValue)) + ",1)";
            break;
        case 4:
        case 5: strSql = addList(asked, strMember, jTerm); break;
        case 6:
        case 7: {
            const auto& order = draws_.of(kOrders);
            jTerm[order.first] = jValue;
            strSql = "ifnull(" + strMember + order.second + bind(asked, jValue) + ",0)";
            break;
        }
        default: {
            const std::string strPattern = pattern();
            jTerm["$like"] = strPattern;
            strSql = "ifnull(like(" + bind(asked, strPattern) + "," + strMember + ",'\\'),0)";
        }
        }
        asked.strSql += " and " + strSql;
    }

    std::string addList(Asked& asked, const std::string& strMember, Json::Value& jTerm)
    {
        Json::Value& jList = jTerm["$in"];
        jList = Json::Value(Json::arrayValue);
        std::string strSql = "0";
        for (std::size_t n = draws_.below(4); 0 < n; --n) {
            const Json::Value jValue = draws_.once(5) ? Json::Value() : value(strMember);
            jList.append(jValue);
            strSql += jValue.isNull() ? " or " + strMember + " isnull"
                                      : " or ifnull(" + strMember + "=" +
                                            bind(asked, bindable(strMember, jValue)) + ",0)";
        }
        return "(" + strSql + ")";
    }

    Asked asked(int iLevel = 0)
    {
        Asked asked;
        std::vector<std::string> names = names_;
        for (std::size_t n = draws_.below(3) + (0 < iLevel ? 1 : 0); 0 < n; --n) {
            const std::size_t u = draws_.below(names.size());
            addTerm(asked, names[u]);
            names.erase(names.begin() + static_cast<std::ptrdiff_t>(u));
        }
        if (2 < iLevel || !draws_.once(3)) return asked;
        const bool blAll = draws_.once(3);
        std::string strGroup = blAll ? "1" : "0";
        for (std::size_t n = 1 + draws_.below(3); 0 < n; --n) {
            const Asked inner = this->asked(iLevel + 1);
            asked.jCondition[blAll ? "$and" : "$or"].append(inner.jCondition);
            strGroup += (blAll ? " and (" : " or (") + inner.strSql + ")";
            asked.bound.insert(asked.bound.end(), inner.bound.begin(), inner.bound.end());
        }
        // The table writes its terms in the order of their names; the sum is the same.
        asked.strSql += " and (" + strGroup + ")";
        return asked;
    }

    // The ids of all that the oracle finds, in its order.
    std::vector<long long> found(Front& front, const Asked& asked, const std::string& strOrder)
    {
        const std::string strSql =
            front.named("select id from @ where " + asked.strSql + " order by " + strOrder);
        sqlite3_stmt* pStatement = nullptr;
        EXPECT_EQ(SQLITE_OK,
                  sqlite3_prepare_v2(database_.get(), strSql.c_str(), -1, &pStatement, nullptr))
            << strSql;
        for (std::size_t u = 0; u < asked.bound.size(); ++u) {
            const int iAt = static_cast<int>(u) + 1;
            const Json::Value& jValue = asked.bound[u];
            if (jValue.isString())
                sqlite3_bind_text(pStatement, iAt, jValue.asCString(), -1, SQLITE_TRANSIENT);
            else
                sqlite3_bind_int64(pStatement, iAt,
                                   jValue.isBool() ? jValue.asBool() : jValue.asInt64());
        }
        std::vector<long long> ids;
        while (SQLITE_ROW == sqlite3_step(pStatement))
            ids.push_back(sqlite3_column_int64(pStatement, 0));
        sqlite3_finalize(pStatement);
        return ids;
    }

    void compare(Front& front)
    {
        const Asked asked = this->asked();
        Json::Value jOptions(Json::objectValue);
        std::string strOrder;
        bool blDescending = false;
        const std::vector<std::string> names = {"big", "code", "flag", "id", "name", "num"};
        for (std::size_t n = draws_.below(4); 0 < n; --n) {
            const std::string& strName = draws_.of(names);
            blDescending = draws_.once(2);
            jOptions["sort"].append((blDescending ? "-" : "") + strName);
            // NULL is below every value.
            strOrder += strName + (blDescending ? " is null," : " is not null,") + strName +
                        (blDescending ? " desc," : ",");
        }
        for (const std::string& strKey : front.table->key())
            strOrder += strKey + (blDescending ? " desc," : ",");
        strOrder.pop_back();
        std::vector<long long> expected = found(front, asked, strOrder);
        EXPECT_EQ(static_cast<long long>(expected.size()), front.table->count(asked.jCondition));
        if (!expected.empty() && draws_.once(2)) {
            const std::size_t uLast = draws_.below(expected.size());
            Json::Value jKey;
            jKey["id"] = Json::Int64(expected[uLast]);
            EXPECT_EQ("1", front.get(jKey));
            jOptions["after"] = front.jStored;
            expected.erase(expected.begin(),
                           expected.begin() + static_cast<std::ptrdiff_t>(uLast) + 1);
        }
        if (draws_.once(3)) {
            const std::size_t nOffset = draws_.below(9);
            jOptions["offset"] = Json::UInt64(nOffset);
            expected.erase(
                expected.begin(),
                expected.begin() + static_cast<std::ptrdiff_t>(std::min(nOffset, expected.size())));
        }
        if (draws_.once(2)) {
            const std::size_t nLimit = draws_.below(9);
            jOptions["limit"] = Json::UInt64(nLimit);
            expected.resize(std::min(nLimit, expected.size()));
        }
        EXPECT_EQ(expected, listed(front, asked.jCondition, jOptions))
            << asked.jCondition << jOptions << asked.strSql;
        Figures::of("front, requests compared")++;
        Figures::of("front, rows compared") += static_cast<long long>(expected.size());
        if (!jOptions.isMember("after")) return;
        // A record that may be none of the table; only the evaluator judges it.
        const std::string& strMember = draws_.of(names_);
        jOptions["after"][strMember] = value(strMember);
        if ("id" != strMember && "code" != strMember && draws_.once(3))
            jOptions["after"].removeMember(strMember);
        listed(front, asked.jCondition, jOptions);
    }

    std::vector<long long> listed(Front& front, const Json::Value& jCondition,
                                  const Json::Value& jOptions)
    {
        EXPECT_EQ(std::string::npos, front.list(jCondition, jOptions).find(':'));
        std::vector<long long> ids;
        Json::Value jLine;
        for (const Json::Value& jRecord : front.jStored) {
            ids.push_back(jRecord["id"].asInt64());
            jLine["ids"].append(jRecord["id"]);
        }
        jLine["condition"] = jCondition;
        jLine["options"] = jOptions;
        jLine["count"] = Json::Int64(front.table->count(jCondition));
        answers_ << text(jLine) << "\n";
        return ids;
    }

    static constexpr const char* kTexts[] = {
        "",         "a",      "A",         "b", "%s", "'", "\\", "a_b", "A\nb", "\u017e\"; --",
        "\u017dab", "\uff07", "\U0001f40e"};
    static constexpr const char* kPieces[] = {"%", "%", "%", "_", "\\",     "\\%",    "\\_",
                                              "a", "B", "'", "s", "\u017e", "\u017d", "\U0001f40e"};
    const Json::Value docs_ =
        json(R"([1, 1.0, 1.5, true, "1", [], ["x"], {}, {"b": 1, "a": [null]}, {"$ne": 1}])");
    const std::vector<std::string> names_ = json(kMembers).getMemberNames();
    Draws draws_;
    std::ofstream answers_;
};

TEST_F(Oracle, FindsTheSameRowsInTheSameOrder)
{
    const long long nRequests = fromEnvironment("VORN_FRONT_REQUESTS", 3000);
    for (const char* szColumns : kTables)
        for (const char* szIndex : kIndexes) {
            Front front(database_, kMembers, szColumns);
            ASSERT_EQ("", front.table->reason());
            fill(front, szColumns);
            front.run(szIndex);
            const long long nEnd = Figures::of("front, requests compared") + nRequests / 9;
            while (nEnd > Figures::of("front, requests compared") && !HasFailure()) {
                compare(front);
                doubles::reset();
            }
        }
    EXPECT_LT(nRequests, Figures::of("front, rows compared"));
}

}  // namespace
