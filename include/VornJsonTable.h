// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
/// @file
/// A table of records for requests from people: whatever it stores comes back as it was sent, and
/// whatever it cannot do exactly it refuses with a reason in words. It stands on VornJsonDbApi.h
/// and needs nothing else of the library.
///
///     #include <VornJsonTable.h>
///     #include <cstdio>
///
///     bool blLogToStdout = false;  // the host defines both flags
///     bool blDebugOutput = false;
///
///     int main()
///     {
///         sqlite3* pDb = nullptr;
///         if (SQLITE_OK != sqlite3_open("stock.db", &pDb)) return 1;
///         Json::Value jDefinition, jRecord, jStored, jCondition, jOptions, jRecords;
///         jDefinition["item"]["member"]["id"]["cpptype"] = "long long";
///         jDefinition["item"]["member"]["name"]["cpptype"] = "string";
///         jDefinition["item"]["member"]["qty"]["cpptype"] = "long long";
///         jDefinition["item"]["member"]["qty"]["cppDefaultValue"] = 0;
///         {
///             VornJsonTable items(pDb, "item", jDefinition,
///                                 "create table if not exists item (id integer primary key, "
///                                 "name text unique, qty integer)");
///             jRecord["name"] = "100% wool";
///             if (0 > items.create(jRecord, jStored)) puts(items.reason().c_str());
///             jCondition["qty"]["$lt"] = 5;
///             jOptions["sort"][0] = "-qty";
///             jOptions["limit"] = 10;
///             if (0 > items.list(jCondition, jOptions, jRecords)) puts(items.reason().c_str());
///         }
///         sqlite3_close(pDb);
///     }
///
/// Results: every operation returns 0 or more, or -1. After -1, reason() says in words which
/// member, operator or option is wrong, which kind of value it has and what was expected; cause()
/// tells a duplicate from a lock. Outputs are written only on success, and nothing has been
/// written to the table. After any result, no statement and no transaction of the table's own is
/// open.
///
/// Exceptions: nothing is thrown except std::bad_alloc, for lack of memory. After it, reason() and
/// cause() are still those of an earlier call.
///
/// Transactions: a call that writes runs in a transaction of its own (`begin immediate`), or in a
/// savepoint if the host has a transaction open; a call that reads runs in a read transaction. Some
/// errors make SQLite roll back the host's transaction too: a full disk, `on conflict rollback`,
/// a statement that is out of steps. sqlite3_get_autocommit() tells.
///
/// Locks: while another connection holds a lock, a call tries again for five seconds or more, as
/// the calls of VornJsonDbApi do. If the lock outlasts that, the cause is kLocked.
///
/// Conditions: an object whose keys are members. All must hold; an empty object or null selects
/// every record:
///
///     {"qty": {"$gte": 5, "$lt": 9}, "lang": {"$in": ["de", "fr"]}, "name": {"$like": "A%"},
///      "note": null, "$or": [{"id": 1}, {"id": 2}]}
///
/// - `{"qty": 5}` and `{"qty": {"$eq": 5}}`: equals; null means that the member is absent;
/// - `$ne`: differs; a record without the member differs from every value;
/// - `$gt`, `$gte`, `$lt`, `$lte`: order of "string", "int" and "long long" members;
/// - `$in`: one of the values of an array;
/// - `$like`: a pattern for a "string" member, with `%`, `_` and a backslash as escape;
/// - `$or` and `$and`, instead of a member: an array of conditions; one must hold, or all.
///
/// JSON members know `$eq`, `$ne`, `$in` and null, and compare their stored text. For such
/// a member an object without a key that begins with "$" is a value; write `{"$eq": value}` if the
/// value comes from outside. The page "The table for requests from people" of the documentation
/// shows the SQL for each operator and type word.
///
/// Options of list() and each(), an object or null:
///
///     {"sort": ["-created", "name"], "limit": 10, "offset": 20, "after": <last record>}
///
/// Records come in the order of "sort" ("-" means descending; a missing member sorts as SQLite
/// sorts NULL: before every value; a member counts once), then by the primary key, in the direction
/// of the last of "sort". "after" takes the last record of a page and gives what follows it.
///
/// Log: the library logs every statement that SQLite refuses, duplicates too, with the values in
/// it. What the table itself refuses is not logged, nor what createMany() binds to prepared
/// statements. The same page says how to keep values out.
///
/// Threads: as for VornJsonDbApi. Do not change the member types of the table through
/// VORN_JSON_DB::recType(), nor the columns of the table, while the object exists.
///
/// Ownership: the host owns the connection, which must outlive the object. The object copies its
/// other arguments and owns its VornJsonDbApi.
#ifndef VORNJSONTABLE_H
#define VORNJSONTABLE_H

#include <VornJsonDbApi.h>

#include <algorithm>
#include <cerrno>
#include <cmath>
#include <functional>
#include <map>
#include <memory>
#include <new>
#include <sstream>
#include <string>
#include <utility>
#include <vector>

static_assert(201703L <= __cplusplus, "VornJsonTable.h needs C++17");

/// One SQLite table as a store of JSON records that come back as they were sent.
class VornJsonTable {
public:
    /// Why a call failed:
    ///
    /// - kNone: it did not;
    /// - kRefused: the table, the record or the request cannot be handled exactly;
    /// - kDuplicate: another record has the same values in the columns of a constraint;
    /// - kLocked: another connection held a lock for too long;
    /// - kChanged: the row was ignored, or is not as it was sent: a trigger, as a rule;
    /// - kLimit: one of the limits was reached;
    /// - kInvalid: another constraint: not null, check, a foreign key, a trigger's raise();
    /// - kFailed: SQLite failed: the disk, memory, a value that is too long.
    enum class Cause { kNone, kRefused, kDuplicate, kLocked, kChanged, kLimit, kInvalid, kFailed };

    /// Limits for requests of strangers. 0 means no limit. The defaults suit a small service.
    struct Limits {
        std::size_t nRequestMembers = 1000;   ///< values in the arguments of a call
        std::size_t nRequestBytes = 1048576;  ///< bytes of their names and texts
        std::size_t nAnswerRows = 1000;       ///< records of a list, or of a page
        std::size_t nAnswerBytes = 16777216;  ///< bytes of their values
        /// Steps of SQLite's virtual machine in a statement. Counting them takes the connection's
        /// one progress handler during each call and leaves the connection without one. A statement
        /// that runs out of them rolls back the host's transaction.
        int nSteps = 0;
    };

    /// Gets one record; returns false to stop.
    using RowCallback = std::function<bool(const Json::Value& jRecord)>;

    /// Binds the open connection @p pDb to the table @p strName as @p jDefinition defines it (the
    /// shape is that of VORN_JSON_DB::recType) and runs @p strCreate: CREATE statements that
    /// succeed if the table already exists (`create table if not exists ...`, which leaves it the
    /// constraints and defaults that it has). They run in a transaction if it does not exist; some
    /// pragmas have no effect there. In the definition, keys of a member other than "cpptype" and
    /// "cppDefaultValue" are ignored.
    ///
    /// If the table cannot be handled exactly, cause() is kRefused after the construction, reason()
    /// names the member or column and what to use instead, and every operation returns -1 with that
    /// reason; if the table did not exist before, it does not exist now. If SQLite fails, every
    /// operation returns -1 with that reason and cause, too: make another object to try again.
    ///
    /// Refused are
    ///
    /// - type words other than "string", "int", "long long", "bool", "Json::objectValue",
    ///   "Json::arrayValue" and "Json::Value", and defaults of another kind than the type word;
    /// - columns that change a value or its order: text in a column that is not text, integers in
    ///   one that is text or real, JSON in one that is not text; anything but "long long" over an
    ///   integer primary key;
    /// - tables without a primary key, or with one of another collation than its columns;
    /// - columns that are missing, not in the definition, generated, or spelt in another case;
    /// - names that are not plain identifiers, or that SQLite does not take without quotes;
    /// - another definition of the same table name earlier in the process.
    VornJsonTable(sqlite3* pDb, std::string strName, Json::Value jDefinition, std::string strCreate)
        : pDb_(pDb), strName_(std::move(strName))
    {
        call({}, [&] { return open(jDefinition, strCreate); });
        refused_ = end_;
    }

    VornJsonTable& operator=(VornJsonTable&&) = delete;  // neither moved nor copied

    /// Why the last call, or the construction, failed, in words; empty if it did not.
    const std::string& reason() const { return end_.strReason; }

    /// The same as a value; kNone if it did not fail.
    Cause cause() const { return end_.cause; }

    /// After a duplicate: the columns of the constraint, in its order; empty for an index on
    /// expressions. Of several such constraints, SQLite names one, not always the primary key.
    const std::vector<std::string>& columns() const { return end_.columns; }

    /// After createMany() failed: the position of the record that failed, counted from 0; -1 if it
    /// was no single one, such as after a lock, a constraint that SQLite checks at the commit, or a
    /// trigger that does not compile.
    /// -1 after any other call.
    long long record() const { return end_.iRecord; }

    /// The members of the primary key, in its order.
    const std::vector<std::string>& key() const { return key_; }

    /// Sets limits for the calls from now on. A new table has none: setLimits({}) sets the defaults
    /// of Limits, and setLimits({0, 0, 0, 0, 0}) removes them.
    void setLimits(const Limits& limits) { limits_ = limits; }

    /// Inserts the record @p jRecord and sets @p jStored to the row as it was read back.
    ///
    /// Defaults of the definition are filled in for members left out; other members left out get
    /// the default of their column. Null is stored as NULL and comes back as an absent member; in
    /// an integer primary key it means the same as leaving it out. The row is compared with what
    /// was sent, member by member: if it differs, it is not kept. Refused are undeclared members,
    /// values of another kind, integers beyond the type word, NUL bytes in a text, invalid UTF-8,
    /// numbers that are not finite, JSON of more than 1,000 levels, and a record without its key
    /// where SQLite does not make one.
    ///
    /// Returns 0 or -1.
    int create(const Json::Value& jRecord, Json::Value& jStored)
    {
        return static_cast<int>(call({&jRecord}, [&] {
            jStored = transact("begin immediate", [&] { return insert(jRecord); });
            return 0;
        }));
    }

    /// Inserts every record of the array @p jRecords as create() does, all of them or none.
    /// They share prepared statements, except those that leave out a member whose column has a
    /// default. record() gives the position of the one that failed, and the reason begins with it.
    /// Returns their number, or -1.
    long long createMany(const Json::Value& jRecords)
    {
        return call({&jRecords}, [&] {
            expect(jRecords.isArray(), "the records are ", jRecords, "an array");
            return transact("begin immediate", [&] {
                // In a transaction of the host's: from here on, no record meets a lock.
                run("insert into " + strName_ + " select * from " + strName_ + " where 0");
                const auto is = [](const auto& str) { return str + " is :" + str; };
                const auto pInsert = prepare("insert into " + strName_ + " (" + join(names_, ",") +
                                             ") values (:" + join(names_, ",:") + ")");
                // In UTF-16, where "a" takes two bytes, it would find what SQLite has replaced.
                const auto pFind = prepare(
                    "select 1 from " + strName_ + " where length(cast('a' as blob))=1 and " +
                    join(names_, " collate binary and ", is) + " collate binary and (" +
                    join(key_, ",") + ")=(:" + join(key_, ",:") + ")");
                for (Json::ArrayIndex u = 0; u < jRecords.size(); ++u) {
                    try {
                        insert(jRecords[u], pInsert.get(), pFind.get());
                    } catch (Failure& failure) {
                        failure.iRecord = u;
                        failure.strReason.insert(0, "record " + std::to_string(u) + ": ");
                        throw;
                    }
                }
                return jRecords.size();
            });
        });
    }

    /// Updates the row that has the key of @p jRecord, or inserts the record as create() does, and
    /// sets @p jStored to the row as it was read back. The record must contain the whole key, which
    /// is stored as it is spelt here, even if the column ignores case. Members left out keep their
    /// value, unless a trigger sets them. No other row is touched: a conflict with another
    /// constraint is a duplicate. Returns 0 or -1.
    int save(const Json::Value& jRecord, Json::Value& jStored)
    {
        return static_cast<int>(call({&jRecord}, [&] {
            check(jRecord, true);
            const std::string strKey = keyIs(jRecord);
            jStored = transact("begin immediate", [&] {
                return 0 < change(strKey, jRecord) ? readBack(strKey, jRecord)[0] : insert(jRecord);
            });
            return 0;
        }));
    }

    /// Sets @p jRecords to the array of the records that the condition selects. Returns their
    /// number, or -1.
    long long list(const Json::Value& jCondition, const Json::Value& jOptions,
                   Json::Value& jRecords)
    {
        return call({&jCondition, &jOptions}, [&] {
            jRecords = page(condition(jCondition), jOptions);
            return jRecords.size();
        });
    }

    /// Calls @p callback with each record that the condition selects, in the order of the options.
    /// It reads pages of 200 records, or of nAnswerRows if that is less, so it needs the memory of
    /// one page. Each page is read as a whole before its records are handed out, and no statement
    /// is open meanwhile, so the callback may use the table; but if it changes the key or a member
    /// of "sort" so that records move on to later pages, they come again, perhaps without end. Open
    /// a transaction around the call if all pages have to show the same state. If the last record
    /// of a page reads otherwise than another program stored it, the call ends with kRefused.
    ///
    /// Returns the number of calls, also if the callback stopped, or -1. If the callback throws
    /// anything but std::bad_alloc, the result is -1 with its message as the reason.
    long long each(const Json::Value& jCondition, const Json::Value& jOptions,
                   const RowCallback& callback)
    {
        return call({&jCondition, &jOptions}, [&] {
            const std::string strWhere = condition(jCondition);
            checkOptions(jOptions);
            Json::Value jNext = jOptions;
            long long iLeft = jNext.get("limit", Json::Value::maxInt64).asInt64();
            const auto nMost = static_cast<long long>(limits_.nAnswerRows);
            const long long iPage = 0 < nMost ? std::min<long long>(nMost, kPage) : kPage;
            for (long long nRecords = 0;; iLeft -= iPage) {
                jNext["limit"] = Json::Int64(std::min(iLeft, iPage));
                const Json::Value jPage = page(strWhere, jNext, true);
                for (const Json::Value& jRecord : jPage) {
                    ++nRecords;
                    if (!callback(jRecord)) return nRecords;
                }
                if (iPage > jPage.size()) return nRecords;
                jNext["after"] = jPage[jPage.size() - 1];
                jNext.removeMember("offset");
            }
        });
    }

    /// Sets @p jRecord to the first record, in the order of the key, that the condition selects.
    /// Returns 1; or 0 if there is none, or -1, and leaves @p jRecord as it was.
    int get(const Json::Value& jCondition, Json::Value& jRecord)
    {
        Json::Value jOptions, jRecords;
        jOptions["limit"] = 1;
        const long long nRecords = list(jCondition, jOptions, jRecords);
        if (0 < nRecords) jRecord.swap(jRecords[0]);
        return static_cast<int>(nRecords);
    }

    /// Returns the number of records that the condition selects, or -1.
    long long count(const Json::Value& jCondition)
    {
        return call({&jCondition}, [&] {
            const std::string strWhere = " where " + condition(jCondition);
            return transact("begin", [&] {
                lockForReading();
                return std::stoll(select("select count(*) from " + strName_ + strWhere)[0]);
            });
        });
    }

    /// Sets the members of the object @p jValues, arrays too, in every record that the condition
    /// selects, and compares the rows with them; a trigger may set other members. It keeps the keys
    /// of these records in memory. Refused are empty conditions and empty values. Returns the
    /// number of records, or -1.
    long long update(const Json::Value& jCondition, const Json::Value& jValues)
    {
        return updateRows(jCondition, jValues, false);
    }

    /// The same for every record of the table.
    long long updateAll(const Json::Value& jValues) { return updateRows({}, jValues, true); }

    /// Deletes the records that the condition selects. An empty condition is refused. Returns the
    /// number of rows deleted, or -1.
    long long remove(const Json::Value& jCondition) { return removeRows(jCondition, false); }

    /// Deletes every record. Returns the number of rows deleted, or -1.
    long long removeAll() { return removeRows({}, true); }

private:
    using Texts = std::vector<std::string>;

    // What a type word means: the rows of kForms.
    enum Form { kText, kInt, kLong, kBool, kObject, kArray, kAny };

    struct FormRow {
        const char* szWord;
        Json::ValueType type;  // of its values
        const char* szExpected;
    };

    // How a call ended. Thrown and caught inside.
    struct Failure {
        Cause cause = Cause::kNone;
        std::string strReason = {};
        Texts columns = {};
        long long iRecord = -1;
    };

    using SortKeys = std::vector<std::pair<std::string, bool>>;  // true: descending

    static constexpr char kWords[] =
        "\"string\", \"int\", \"long long\", \"bool\", \"Json::objectValue\", \"Json::arrayValue\" "
        "or \"Json::Value\"; fractions as integers of the smallest unit, as text or inside JSON";
    static constexpr FormRow kForms[] = {
        {"string", Json::stringValue, "a string"},
        {"int", Json::intValue, "an integer from -2147483648 to 2147483647"},
        {"long long", Json::intValue,
         "an integer from -9223372036854775808 to 9223372036854775807"},
        {"bool", Json::booleanValue, "a boolean"},
        {"Json::objectValue", Json::objectValue, "an object"},
        {"Json::arrayValue", Json::arrayValue, "an array"},
        {"Json::Value", Json::nullValue, "a JSON value"}};
    static constexpr int kPage = 200;  // rows that are read together

    // ---- Calls

    [[noreturn]] static void fail(const std::string& strWhy, Cause cause = Cause::kRefused)
    {
        throw Failure{cause, strWhy};
    }

    [[noreturn]] static void failMember(const std::string& strMember, const std::string& strWhy)
    {
        fail("member " + quoted(strMember) + ": " + strWhy);
    }

    static void expect(bool blFits, const std::string& strWhat, const Json::Value& jValue,
                       const char* szExpected)
    {
        if (!blFits) fail(strWhat + kindOf(jValue) + ", expected " + szExpected);
    }

    // Runs the work in a transaction, or in a savepoint of the host's, and undoes it if it throws.
    template <typename Work>
    auto transact(const char* szBegin, Work work) -> decltype(work())
    {
        const bool blHosts = 0 == sqlite3_get_autocommit(pDb_);
        const char* szUndo = blHosts ? "rollback to vorn_table; release vorn_table" : "rollback";
        run(blHosts ? "savepoint vorn_table" : szBegin);
        limitSteps(limits_.nSteps);
        try {
            auto result = work();
            run(blHosts ? "release vorn_table" : "commit");
            limitSteps(0);
            return result;
        } catch (...) {
            limitSteps(0);
            // Twice, because the first may lack memory. SQLite may have rolled back by itself.
            for (int i = 0; i < 2 && 0 == sqlite3_get_autocommit(pDb_); ++i)
                if (SQLITE_OK == sqlite3_exec(pDb_, szUndo, nullptr, nullptr, nullptr)) break;
            throw;
        }
    }

    // Has SQLite stop a statement after so many steps; 0: no more. With EAGAIN in errno, the
    // library would try it again.
    void limitSteps(int nSteps)
    {
        const auto stop = [](void*) {
            errno = 0;
            return 1;
        };
        if (0 < limits_.nSteps) sqlite3_progress_handler(pDb_, nSteps, stop, nullptr);
    }

    // Every operation goes through here: what is thrown inside becomes -1 and a reason.
    template <typename Work>
    long long call(std::initializer_list<const Json::Value*> arguments, Work work)
    {
        long long iResult = -1;
        try {
            if (!refused_.strReason.empty()) throw Failure(refused_);
            std::size_t nMembers = 0;
            std::size_t nBytes = 0;
            for (const Json::Value* pjArgument : arguments) measure(*pjArgument, nMembers, nBytes);
            checkLimit("the request has", limits_.nRequestMembers, nMembers, " values");
            checkLimit("the request has", limits_.nRequestBytes, nBytes, " bytes");
            iResult = work();
            end_ = {};
        } catch (const Failure& failure) {
            end_ = failure;
        } catch (const std::bad_alloc&) {
            throw;
        } catch (const std::exception& error) {
            end_ = {Cause::kFailed, error.what()};
        } catch (...) {
            end_ = {Cause::kFailed, "the callback threw"};
        }
        return iResult;
    }

    static void checkLimit(const char* szWhat, std::size_t nMost, std::size_t n, const char* szUnit)
    {
        if (0 < nMost && nMost < n)
            fail(szWhat + (" more than " + std::to_string(nMost)) + szUnit, Cause::kLimit);
    }

    void measure(const Json::Value& jValue, std::size_t& nMembers, std::size_t& nBytes) const
    {
        if (0 == limits_.nRequestMembers && 0 == limits_.nRequestBytes) return;
        if (jValue.isString()) nBytes += jValue.asString().size();
        for (auto it = jValue.begin(); it != jValue.end(); ++it) {
            ++nMembers;
            if (jValue.isObject()) nBytes += it.name().size();
            measure(*it, nMembers, nBytes);
        }
    }

    // ---- Statements

    // Throws what SQLite says about the statement that has just failed.
    [[noreturn]] void failSql() const
    {
        const int iCode = sqlite3_extended_errcode(pDb_);
        const int iPrimary = iCode & 0xff;
        const std::string strError = sqlite3_errmsg(pDb_);
        const std::string strSteps = std::to_string(limits_.nSteps);
        if (SQLITE_INTERRUPT == iPrimary && 0 < limits_.nSteps)
            fail("a statement takes more than " + strSteps + " steps", Cause::kLimit);
        if (SQLITE_BUSY == iPrimary || SQLITE_LOCKED == iPrimary)
            fail("locked: " + strError, Cause::kLocked);
        const Cause other = SQLITE_CONSTRAINT == iPrimary ? Cause::kInvalid : Cause::kFailed;
        if (SQLITE_CONSTRAINT_UNIQUE != iCode && SQLITE_CONSTRAINT_PRIMARYKEY != iCode &&
            SQLITE_CONSTRAINT_ROWID != iCode)
            fail(strError, other);
        // UNIQUE constraint failed: item.name, item.lang
        Texts columns;
        std::istringstream words(strError.substr(strError.find(':') + 1));
        for (std::string strWord; words >> strWord && "index" != strWord;) {
            const std::size_t uDot = strWord.find('.');
            // A trigger may have written to another table.
            if (0 != sqlite3_stricmp(strWord.substr(0, uDot).c_str(), strName_.c_str()))
                fail(strError, other);
            columns.push_back(strWord.substr(uDot + 1, strWord.find(',') - uDot - 1));
        }
        throw Failure{Cause::kDuplicate, "duplicate: " + strError, columns};
    }

    // Runs statements whose rows do not matter. Returns the number of rows that the last one
    // changed.
    int run(const std::string& strSql)
    {
        const int iChanges = pApi_->runSqlEx(strSql);
        if (0 > iChanges) failSql();
        return iChanges;
    }

    void checkChanges(long long nRows) const
    {
        if (nRows != sqlite3_changes(pDb_))
            fail("a trigger or an \"on conflict\" clause ignored a record", Cause::kChanged);
    }

    // From here on, no read in the transaction meets a lock.
    void lockForReading() { run("select 1 from " + strName_ + " limit 1"); }

    std::unique_ptr<sqlite3_stmt, int (*)(sqlite3_stmt*)> prepare(const std::string& strSql) const
    {
        sqlite3_stmt* pStatement = nullptr;
        sqlite3_prepare_v2(pDb_, strSql.c_str(), -1, &pStatement, nullptr);
        return {pStatement, sqlite3_finalize};
    }

    // The first column of a statement of the table's own; NULL as an empty text.
    Texts select(const std::string& strSql) const
    {
        const auto pStatement = prepare(strSql);
        if (nullptr == pStatement) failSql();
        Texts cells;
        while (SQLITE_ROW == sqlite3_step(pStatement.get())) {
            const auto* szText = sqlite3_column_text(pStatement.get(), 0);
            cells.emplace_back(szText ? reinterpret_cast<const char*>(szText) : "");
        }
        if (SQLITE_OK != sqlite3_reset(pStatement.get())) failSql();
        return cells;
    }

    // Appends the records that the raw filter selects, as the library decodes them.
    void addRows(const std::string& strFilter, Json::Value& jRows)
    {
        Json::Value jRequest;
        jRequest["vornSqlWhereFilter"] = strFilter;
        if (0 > pApi_->recList(jRequest, jRows)) failSql();
    }

    // The SQL of a value that fits: 'O''Brien', 5, null
    std::string literal(std::string strMember, const Json::Value& jValue)
    {
        if (jValue.isNull()) return "null";
        if (isNumber(formOf(strMember))) return std::to_string(jValue.asInt64());
        std::string strTerm;  // name='O''Brien'
        if (0 > pApi_->SqlMakeByMatchField(strMember, const_cast<Json::Value&>(jValue), strTerm))
            throw std::bad_alloc();
        return strTerm.substr(strMember.size() + 1);
    }

    // name='O''Brien', id=5, note is null
    std::string equals(const std::string& strMember, const Json::Value& jValue)
    {
        return strMember + (jValue.isNull() ? " is " : "=") + literal(strMember, jValue);
    }

    // ('x','en')
    std::string values(const Texts& names, const Json::Value& jRecord)
    {
        const auto value = [&](const auto& strName) { return literal(strName, jRecord[strName]); };
        return "(" + join(names, ",", value) + ")";
    }

    template <typename Range, typename ToText>
    static std::string join(const Range& range, const char* szBetween, ToText toText)
    {
        std::string strOut;
        for (const auto& each : range) strOut += (strOut.empty() ? "" : szBetween) + toText(each);
        return strOut;
    }

    static std::string join(const Texts& texts, const char* szBetween)
    {
        return join(texts, szBetween, [](const auto& strText) { return strText; });
    }

    // ---- Construction

    int open(Json::Value& jDefinition, std::string& strCreate)
    {
        if (nullptr == pDb_) fail("the connection is null");
        if (strCreate.empty()) fail("the CREATE statement is empty");
        checkName("table ", strName_);
        const Json::Value jMembers =
            Json::Path("." + strName_ + ".member").resolve(std::as_const(jDefinition));
        if (!jMembers.isObject() || jMembers.empty())
            fail("the definition has no members for the table " + quoted(strName_));
        names_ = jMembers.getMemberNames();
        Json::Value jTypes;
        for (const std::string& strMember : names_) {
            checkName("member ", strMember);
            const Json::Value& jMember = jMembers[strMember];
            const bool blWord = jMember.isObject() && jMember["cpptype"].isString();
            const std::string strWord = blWord ? jMember["cpptype"].asString() : "";
            const auto found = std::find_if(std::begin(kForms), std::end(kForms),
                                            [&](const auto& row) { return row.szWord == strWord; });
            if (std::end(kForms) == found)
                failMember(strMember, "type word " + quoted(strWord) + ", expected " + kWords);
            members_[strMember] = static_cast<Form>(found - std::begin(kForms));
            checkFits(strMember, jMember["cppDefaultValue"], "the default is ");
            for (const char* szKey : {"cpptype", "cppDefaultValue"})
                if (jMember.isMember(szKey)) jTypes[strMember][szKey] = jMember[szKey];
        }
        // Not the CREATE: the table must not stay if it is refused.
        std::string strNothing = "select 1";
        pApi_ = std::make_unique<VornJsonDbApi>(pDb_, strName_, jDefinition, strNothing);
        const bool blNew = nullptr == prepare("select 1 from " + strName_);
        if (!blNew) run(strCreate);
        return transact(blNew ? "begin immediate" : "begin", [&] {
            if (blNew) run(strCreate);
            lockForReading();
            readColumns();
            if (!prepare("update " + strName_ + " set " + join(names_, "=null,") + "=null"))
                fail("table " + quoted(strName_) + ": " + sqlite3_errmsg(pDb_));
            // Types are kept by table name for the life of the process.
            const Json::Value& jHeld = VORN_JSON_DB::recType(jDefinition, strName_);
            if (jHeld.toStyledString() != jTypes.toStyledString())
                fail("the process already holds the table " + quoted(strName_) +
                     " with other types; use the same definition or another name");
            return 0;
        });
    }

    // Names are written without quotes. SQLite takes some of its words as names, but
    // "current_time" is the time even so.
    void checkName(const char* szWhat, const std::string& strName) const
    {
        constexpr char kPlain[] = "abcdefghijklmnopqrstuvwxyzABCDEFGHIJKLMNOPQRSTUVWXYZ_0123456789";
        const std::string strSql = join({"with ", " as (select 7 as ", ") select ", "||", " from ",
                                         " where (", "=7) order by ", " desc"},
                                        strName.c_str());
        if ('9' >= strName[0] || std::string::npos != strName.find_first_not_of(kPlain) ||
            !prepare(strSql) || Texts{"77"} != select(strSql))
            fail(szWhat + quoted(strName) +
                 ": expected letters, digits and \"_\", and no keyword of SQL");
    }

    void readColumns()
    {
        const std::string strColumns = "from pragma_table_xinfo('" + strName_ + "') where ";
        key_ = select("select name " + strColumns + "pk order by pk");
        if (key_.empty()) fail("table " + quoted(strName_) + ": no primary key");
        // One for each member of the key, which may name it twice.
        const Texts collations =
            select("select coll from pragma_index_list('" + strName_ +
                   "') as l, pragma_index_xinfo(l.name) where origin='pk' and key "
                   "group by cid order by min(seqno)");
        // An integer primary key is the rowid itself and has no index.
        blRowidKey_ = collations.empty();
        for (std::size_t u = 0; u < collations.size(); ++u) {
            const char* szCollation = "";
            sqlite3_table_column_metadata(pDb_, nullptr, strName_.c_str(), key_[u].c_str(), nullptr,
                                          &szCollation, nullptr, nullptr, nullptr);
            if (0 != sqlite3_stricmp(collations[u].c_str(), szCollation))
                failMember(key_[u], "the primary key has another collation than the column");
        }
        for (const std::string& strMember : names_) {
            const Texts types =
                select(join({"select type ", strColumns, "name='", strMember, "'"}, ""));
            if (types.empty()) failMember(strMember, "the table has no column of this name");
            // Another affinity changes a value or its order.
            const bool blText = kText == formOf(strMember) || isJson(formOf(strMember));
            const std::string strKind = select("select typeof(cast('7' as " + types[0] + "))")[0];
            if (!types[0].empty() && "blob" != strKind && (blText ? "text" : "integer") != strKind)
                failMember(strMember, "column type " + quoted(types[0]) + ", expected " +
                                          (blText ? "a text column" : "an integer column"));
        }
        const std::string strAbsent = "select name " + strColumns + "pk or dflt_value is null";
        for (const std::string& strMember : select(strAbsent)) jAbsent_[strMember];
        if (blRowidKey_ && kLong != formOf(key_[0]))
            failMember(key_[0], "over an integer primary key, expected \"long long\"");
        const Texts others = select("select name " + strColumns + "hidden<>1 and name not in ('" +
                                    join(names_, "','") + "')");
        if (!others.empty())
            fail("column " + quoted(others[0]) + ": not in the definition; declare it");
    }

    // ---- Values

    Form formOf(const std::string& strMember) const
    {
        const auto found = members_.find(strMember);
        if (members_.end() != found) return found->second;
        failMember(strMember, "not declared for the table " + quoted(strName_));
    }

    // A text from outside in a reason: one line, and not too long.
    static std::string quoted(const std::string& strText)
    {
        return Json::valueToQuotedString(strText.substr(0, 60).c_str());
    }

    static std::string kindOf(const Json::Value& jValue)
    {
        constexpr const char* kKinds[] = {
            "null",     "the integer ", "the integer ", "a floating-point number",
            "a string", "a boolean",    "an array",     "an object"};
        const bool blInteger = jValue.isIntegral() && Json::realValue != jValue.type();
        return kKinds[jValue.type()] + (blInteger ? jValue.asString() : "");
    }

    static bool isJson(Form form) { return kObject <= form; }
    static bool isNumber(Form form) { return kText != form && !isJson(form); }  // a bool is 1 or 0

    static bool hasKind(Form form, const Json::Value& jValue)
    {
        const Json::ValueType type = kForms[form].type;
        if (Json::intValue != type) return kAny == form || type == jValue.type();
        return Json::realValue != jValue.type() &&
               (kInt == form ? jValue.isInt() : jValue.isInt64());
    }

    void checkFits(const std::string& strMember, const Json::Value& jValue, const char* szIs = "",
                   bool blNull = true) const
    {
        const Form form = formOf(strMember);
        const bool blKind = hasKind(form, jValue);
        if (jValue.isNull() ? blNull : blKind && isExact(form, jValue, 1)) return;
        const char* szExpected = !blKind         ? kForms[form].szExpected
                                 : kText == form ? "UTF-8 without NUL bytes"
                                                 : "UTF-8, finite numbers and 1000 levels at most";
        failMember(strMember, szIs + kindOf(jValue) + ", expected " + szExpected);
    }

    // Whether a text can hold the value.
    static bool isExact(Form form, const Json::Value& jValue, int iLevel)
    {
        if (1000 < iLevel) return false;  // the library reads no more
        if (jValue.isString()) return isUtf8(jValue.asString(), kText != form);
        if (Json::realValue == jValue.type()) return std::isfinite(jValue.asDouble());
        for (auto it = jValue.begin(); it != jValue.end(); ++it)
            if (!isExact(form, *it, iLevel + 1) || (jValue.isObject() && !isUtf8(it.name(), true)))
                return false;
        return true;
    }

    static bool isUtf8(const std::string& strText, bool blNul)
    {
        constexpr unsigned kLeast[] = {0, 0x80, 0x800, 0x10000};
        for (std::size_t u = 0; u < strText.size();) {
            unsigned c = static_cast<unsigned char>(strText[u++]);
            const unsigned uMore = 0xf0 <= c ? 3 : 0xe0 <= c ? 2 : 0xc0 <= c ? 1 : 0;
            if (0 == uMore && (0x80 <= c || (0 == c && !blNul))) return false;
            if (0 < uMore) c &= 1 == uMore ? 0x1fU : 0x0fU;
            for (unsigned i = 0; i < uMore; ++i) {
                const unsigned uNext = static_cast<unsigned char>(strText[u++]);
                if (0x80 != (uNext & 0xc0)) return false;  // so is the NUL at the end
                c = c << 6 | (uNext & 0x3fU);
            }
            if (kLeast[uMore] > c || 0x10ffff < c || (0xd800 <= c && 0xdfff >= c)) return false;
        }
        return true;
    }

    // ---- Writing

    const Json::Value& check(const Json::Value& jRecord, bool blKey = false) const
    {
        expect(jRecord.isObject(), "the record is ", jRecord, "an object");
        for (auto it = jRecord.begin(); it != jRecord.end(); ++it) checkFits(it.name(), *it);
        for (const std::string& strKey : key_)
            if (jRecord[strKey].isNull() && (blKey || (!blRowidKey_ && jRecord.isMember(strKey))))
                failMember(strKey, "missing, expected the whole key");
        return jRecord;
    }

    // With its defaults, and null for what no column fills in: in an integer key, SQLite does. A
    // record that lacks nothing is not copied.
    const Json::Value& filled(const Json::Value& jRecord, Json::Value& jCopy)
    {
        expect(jRecord.isObject(), "the record is ", jRecord, "an object");
        if (names_.size() == jRecord.size()) return check(jRecord, !blRowidKey_);
        jCopy = jRecord;
        pApi_->fillDefaultValue(jCopy, false);
        VORN_JSON_DB::jsonCopyMember(jCopy, jAbsent_, false);
        return check(jCopy, !blRowidKey_);
    }

    // (code,lang)=('x','en')
    std::string keyIs(const Json::Value& j)
    {
        return "(" + join(key_, ",") + ")=" + values(key_, j);
    }

    // insert into item (id,name) values (1,'x')
    // What the prepared statements cannot hold goes as text. Returns the row, or null if they have
    // found it.
    Json::Value insert(const Json::Value& jSent, sqlite3_stmt* pInsert = nullptr,
                       sqlite3_stmt* pFind = nullptr)
    {
        Json::Value jCopy;
        const Json::Value* pjRecord = &filled(jSent, jCopy);
        const bool blBound = pInsert && pFind && names_.size() == pjRecord->size();
        if (blBound)
            step(pInsert, *pjRecord);
        else
            run("insert into " + strName_ + " (" + join(pjRecord->getMemberNames(), ",") +
                ") values " + values(pjRecord->getMemberNames(), *pjRecord));
        checkChanges(1);
        if ((*pjRecord)[key_[0]].isNull()) {
            jCopy = *pjRecord;
            jCopy[key_[0]] = Json::Int64(sqlite3_last_insert_rowid(pDb_));
            pjRecord = &jCopy;
        }
        if (blBound && step(pFind, *pjRecord)) return {};
        return readBack(keyIs(*pjRecord), *pjRecord)[0];
    }

    // Binds what the text of the record would hold. Returns whether the statement gives a row.
    bool step(sqlite3_stmt* pStatement, const Json::Value& jRecord)
    {
        int i = 0;
        for (const auto& [strName, form] : members_) {
            const Json::Value& jValue = jRecord[strName];
            std::string strText = kText == form ? jValue.asString() : "";
            const std::string strSql = isJson(form) ? literal(strName, jValue) : "";
            for (std::size_t u = 1; u + 1 < strSql.size(); u += '\'' == strSql[u] ? 2 : 1)
                strText += strSql[u];
            const char* szText = jValue.isNull() ? nullptr : strText.data();
            ++i;
            if (SQLITE_OK != (isNumber(form) && nullptr != szText
                                  ? sqlite3_bind_int64(pStatement, i, jValue.asInt64())
                                  : sqlite3_bind_text64(pStatement, i, szText, strText.size(),
                                                        SQLITE_TRANSIENT, SQLITE_UTF8)))
                failSql();
        }
        sqlite3_stmt_status(pStatement, SQLITE_STMTSTATUS_VM_STEP, 1);  // nSteps is for each step
        bool blRow = false;
        while (SQLITE_ROW == sqlite3_step(pStatement)) blRow = true;
        if (SQLITE_OK != sqlite3_reset(pStatement)) failSql();
        return blRow;
    }

    // The rows, at least n, which have to hold the values that were sent: a trigger may have
    // changed them. SQL tells numbers by value and kind.
    Json::Value readBack(const std::string& strRows, const Json::Value& jSent, std::size_t n = 1)
    {
        Json::Value jRows;
        addRows(strRows, jRows);
        for (auto it = jSent.begin(); it != jSent.end(); ++it) {
            const std::string str = it.name();
            const auto same = [&](const Json::Value& jRow) {
                return *it == jRow[str] || literal(str, *it) == literal(str, jRow[str]);
            };
            if (n > jRows.size() || !std::all_of(jRows.begin(), jRows.end(), same))
                fail("member " + quoted(str) + ": the row differs or is gone; see the triggers",
                     Cause::kChanged);
        }
        return jRows;
    }

    // update item set (id,name)=(1,'x') where id=1
    // Returns the number of rows, after comparing them.
    long long change(const std::string& strWhere, const Json::Value& jValues)
    {
        lockForReading();
        // The key of each row as it will be: quote() gives the SQL of a value.
        const auto column = [&](const auto& strKey) {
            return "'" + strKey + " is '||quote(" +
                   (jValues.isMember(strKey) ? literal(strKey, jValues[strKey]) : strKey) + ")";
        };
        const Texts terms = select("select " + join(key_, "||' and '||", column) + " from " +
                                   strName_ + " where " + strWhere);
        const auto nRows = static_cast<std::ptrdiff_t>(terms.size());
        const Texts names = jValues.getMemberNames();
        run("update " + strName_ + " set (" + join(names, ",") + ")=" + values(names, jValues) +
            " where " + strWhere);
        checkChanges(nRows);
        for (std::ptrdiff_t i = 0; i < nRows; i += kPage) {
            const auto begin = terms.begin() + i;
            const Texts batch(begin, begin + std::min<std::ptrdiff_t>(kPage, nRows - i));
            readBack(join(batch, " or "), jValues, batch.size());
        }
        return nRows;
    }

    long long updateRows(const Json::Value& jCondition, const Json::Value& jValues, bool blAll)
    {
        return call({&jCondition, &jValues}, [&] {
            const std::string strWhere = condition(jCondition, blAll);
            check(jValues);
            if (jValues.empty()) fail("there are no values to set");
            return transact("begin immediate", [&] { return change(strWhere, jValues); });
        });
    }

    long long removeRows(const Json::Value& jCondition, bool blAll)
    {
        return call({&jCondition}, [&] {
            const auto strSql =
                "delete from " + strName_ + " where " + condition(jCondition, blAll);
            return transact("begin immediate", [&] { return run(strSql); });
        });
    }

    // ---- Conditions

    // The SQL of a condition; 1 for an empty one.
    std::string condition(const Json::Value& jCondition, bool blAll = true)
    {
        nTerms_ = 0;
        if (!jCondition.empty() || jCondition.isArray()) return "(" + terms(jCondition, 0) + ")";
        if (!blAll) fail("the condition is empty; updateAll() and removeAll() take every record");
        return "1";
    }

    // a=1 and ((b=2) or (c=3))
    std::string terms(const Json::Value& jCondition, int iNesting)
    {
        expect(jCondition.isObject(), "the condition is ", jCondition, "an object");
        if (jCondition.empty()) fail("a condition in a list is empty");
        if (10 < iNesting) fail("the condition has lists nested deeper than 10 levels");
        Texts parts;
        for (const std::string& strName : jCondition.getMemberNames()) {
            const Json::Value& jValue = jCondition[strName];
            const bool blAnd = "$and" == strName;
            if (!blAnd && "$or" != strName) {
                parts.push_back(memberTerms(strName, jValue));
                continue;
            }
            expect(jValue.isArray() && !jValue.empty(), "operator " + quoted(strName) + ": ",
                   jValue, "one or more conditions in an array");
            Texts list;
            for (Json::ArrayIndex u = 0; u < jValue.size(); ++u)
                list.push_back(terms(jValue[u], iNesting + 1));
            parts.push_back("((" + join(list, blAnd ? ") and (" : ") or (") + "))");
        }
        return join(parts, " and ");
    }

    // A JSON member may equal an object: only names that begin with "$" are operators.
    std::string memberTerms(const std::string& strMember, const Json::Value& jValue)
    {
        const Texts names = jValue.isObject() ? jValue.getMemberNames() : Texts();
        const auto isOperator = [](const std::string& strName) { return '$' == strName[0]; };
        const bool blAny = std::any_of(names.begin(), names.end(), isOperator);
        const bool blOperators = isJson(formOf(strMember)) ? blAny : jValue.isObject();
        if (!blOperators) return term(strMember, "$eq", jValue);
        if (names.empty()) failMember(strMember, "an empty object, expected operators");
        const auto part = [&](const auto& str) { return term(strMember, str, jValue[str]); };
        return join(names, " and ", part);
    }

    std::string term(const std::string& strMember, const std::string& strOperator,
                     const Json::Value& jValue)
    {
        if (300 < ++nTerms_) fail("the condition has more than 300 terms");
        if ("$in" == strOperator) return listTerm(strMember, jValue);
        // Its SQL, and the last form that it is for.
        static const std::map<std::string, std::pair<const char*, Form>> operators = {
            {"$eq", {"=", kAny}},        {"$ne", {" is not ", kAny}}, {"$gt", {">", kLong}},
            {"$gte", {">=", kLong}},     {"$lt", {"<", kLong}},       {"$lte", {"<=", kLong}},
            {"$like", {" like ", kText}}};
        const auto found = operators.find(strOperator);
        const std::string strWhat =
            "member " + quoted(strMember) + ": operator " + quoted(strOperator) + ": ";
        constexpr char kKnown[] =
            "\"$eq\", \"$ne\", \"$gt\", \"$gte\", \"$lt\", \"$lte\", \"$in\" or \"$like\"";
        if (operators.end() == found) fail(strWhat + "unknown, expected " + kKnown);
        const auto [szSql, last] = found->second;
        const Form form = formOf(strMember);
        const bool blLike = kText == last;
        if (last < form)
            fail(strWhat + "type word " + quoted(kForms[form].szWord) + ", expected " +
                 (blLike ? "\"string\"" : "\"string\", \"int\" or \"long long\""));
        checkFits(strMember, jValue, "", kAny == last);
        if (blLike && 1000 < jValue.asString().size()) fail(strWhat + "more than 1000 bytes");
        if ("$eq" == strOperator) return equals(strMember, jValue);
        return strMember + szSql + literal(strMember, jValue) + (blLike ? " escape '\\'" : "");
    }

    // A record without the member is in no list, unless null is in the list.
    std::string listTerm(const std::string& strMember, const Json::Value& jList)
    {
        expect(jList.isArray(), "member " + quoted(strMember) + ": operator \"$in\": ", jList,
               "an array");
        Texts items;
        for (const Json::Value& jValue : jList) {
            checkFits(strMember, jValue);
            if (!jValue.isNull()) items.push_back(literal(strMember, jValue));
        }
        return "(" + strMember + " in (" + join(items, ",") + ")" +
               (items.size() < jList.size() ? " or " + strMember + " is null" : "") + ")";
    }

    // ---- Sorting and pages

    static void checkOptions(const Json::Value& jOptions)
    {
        expect(jOptions.isNull() || jOptions.isObject(), "the options are ", jOptions, "an object");
        for (const std::string& strOption : jOptions.getMemberNames()) {
            const Json::Value& jValue = jOptions[strOption];
            const std::string strWhat = "option " + quoted(strOption) + ": ";
            if ("limit" == strOption || "offset" == strOption)
                expect(hasKind(kLong, jValue) && 0 <= jValue.asInt64(), strWhat, jValue,
                       "an integer from 0 to 9223372036854775807");
            else if ("sort" == strOption)
                expect(jValue.isArray(), strWhat, jValue, "an array of names");
            else if ("after" == strOption)
                expect(jValue.isNull() || jValue.isObject(), strWhat, jValue, "a record");
            else
                fail(strWhat + "unknown, expected \"sort\", \"limit\", \"offset\" or \"after\"");
        }
    }

    // The members of "sort" and then the key, so that no two records are equal.
    SortKeys sortKeys(const Json::Value& jSort) const
    {
        SortKeys keys;
        bool blDescending = false;
        // A second time, a member changes nothing.
        const auto add = [&](const std::string& strMember) {
            const auto isIt = [&](const auto& key) { return strMember == key.first; };
            if (std::none_of(keys.begin(), keys.end(), isIt))
                keys.emplace_back(strMember, blDescending);
        };
        for (const Json::Value& jKey : jSort) {
            expect(jKey.isString(), "option \"sort\": ", jKey, "the name of a member");
            const std::string strKey = jKey.asString();
            blDescending = '-' == strKey[0];
            const std::string strMember = strKey.substr(blDescending ? 1 : 0);
            if (isJson(formOf(strMember)))
                failMember(strMember, "JSON in option \"sort\", expected what has an order");
            add(strMember);
        }
        std::for_each(key_.begin(), key_.end(), add);
        return keys;
    }

    // What follows the last record, in parts that an index can find: first the rows that differ
    // from it in the last key only, then those that differ in the one before, and so on.
    Texts rangesAfter(const SortKeys& keys, const Json::Value& jLast, bool blStored = false)
    {
        if (jLast.isNull()) return {"1"};
        check(jLast, true);
        std::string strEqual;
        Texts ranges;
        for (const auto& [strName, blDescending] : keys) {
            const Json::Value& jValue = jLast[strName];
            const std::string strRange = strEqual + strName;
            // In reverse: NULL comes first, and last in a descending order.
            if (jValue.isNull() != blDescending)
                ranges.push_back(strRange + (jValue.isNull() ? " is not null" : " is null"));
            if (!jValue.isNull())
                ranges.push_back(strRange + (blDescending ? "<" : ">") + literal(strName, jValue));
            strEqual += equals(strName, jValue) + " and ";
        }
        std::reverse(ranges.begin(), ranges.end());
        // Otherwise the next page would begin anywhere.
        if (blStored && select("select 1 from " + strName_ + " where " + strEqual + "1").empty())
            fail("the last record of a page reads otherwise than it is stored");
        return ranges;
    }

    // The rows of a list. The raw filter carries the order, the limit and the offset.
    Json::Value page(const std::string& strWhere, const Json::Value& jOptions, bool blMore = false)
    {
        checkOptions(jOptions);
        const SortKeys keys = sortKeys(jOptions["sort"]);
        const auto order = [](const auto& key) { return key.first + (key.second ? " desc" : ""); };
        const std::string strOrder = ") order by " + join(keys, ",", order) + " limit ";
        const std::string strOffset = jOptions.get("offset", 0).asString();
        // One more than allowed shows that there are too many.
        const auto nMost = static_cast<long long>(limits_.nAnswerRows);
        const Json::Int64 iMost =
            0 < nMost && Json::Value::maxInt64 > nMost ? nMost + 1 : Json::Value::maxInt64;
        const long long iLimit = jOptions.get("limit", iMost).asInt64();
        checkLimit("option \"limit\":", limits_.nAnswerRows, jOptions.get("limit", 0).asUInt64(),
                   " records");
        Texts ranges = rangesAfter(keys, jOptions["after"]);
        // Rows are skipped in all parts together, so they become one.
        if ("0" != strOffset) ranges = {"(" + join(ranges, " or ") + ")"};
        return transact("begin", [&] {
            lockForReading();
            Json::Value jRecords(Json::arrayValue);
            std::size_t nBytes = 0;
            for (const std::string& strRange : ranges) {
                const std::string strLeft = std::to_string(iLimit - jRecords.size());
                const std::string strFilter = join(
                    {strWhere, " and ", strRange, strOrder, strLeft, " offset (", strOffset}, "");
                if (0 < limits_.nAnswerBytes) nBytes += bytesOf(strFilter);
                checkLimit("the answer has", limits_.nAnswerBytes, nBytes, " bytes");
                addRows(strFilter, jRecords);
                if (iLimit == jRecords.size()) break;
            }
            checkLimit("the answer has", limits_.nAnswerRows, jRecords.size(),
                       " records; use the option \"limit\"");
            if (blMore && !jRecords.empty() && iLimit == jRecords.size())
                rangesAfter(keys, jRecords[jRecords.size() - 1], true);
            return jRecords;
        });
    }

    // Known before the rows take memory.
    std::size_t bytesOf(const std::string& strFilter) const
    {
        const auto part = [](const auto& s) { return "ifnull(length(cast(" + s + " as blob)),0)"; };
        const std::string strSum = join(names_, "+", part);
        return std::stoull(select("select cast(total(n) as integer) from (select " + strSum +
                                  " as n from " + strName_ + " where (" + strFilter + "))")[0]);
    }

    sqlite3* const pDb_;
    std::string strName_;
    std::unique_ptr<VornJsonDbApi> pApi_;
    std::map<std::string, Form> members_;
    Texts names_;          // of the members
    Json::Value jAbsent_;  // null for each member that neither SQLite nor its column fills in
    Texts key_;
    bool blRowidKey_ = false;  // the key is the integer primary key
    Limits limits_{0, 0, 0, 0, 0};
    Failure refused_;  // of the construction
    Failure end_;      // of the last call
    int nTerms_ = 0;   // of the condition that is being translated
};

#endif
