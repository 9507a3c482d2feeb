// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
/// @file
/// JSON records in SQLite tables: the whole public interface of libvornjsondb.
///
/// A host opens an SQLite connection, creates one handle per table and works with records, which
/// are JSON objects whose keys are column names:
///
///     #include <VornJsonDbApi.h>
///     #include <cstdio>
///
///     bool blLogToStdout = false;  // the host defines both flags
///     bool blDebugOutput = false;
///
///     int main()
///     {
///         sqlite3* pDb = nullptr;
///         if (SQLITE_OK != sqlite3_open("tasks.db", &pDb)) return 1;
///         std::string strName = "task";
///         std::string strCreate =
///             "create table if not exists task (id integer primary key, name text)";
///         Json::Value jDefinition;
///         jDefinition["task"]["member"]["id"]["cpptype"] = "long long";
///         jDefinition["task"]["member"]["name"]["cpptype"] = "string";
///         jDefinition["task"]["member"]["name"]["cppDefaultValue"] = "unnamed";
///         {
///             VornJsonDbApi task(pDb, strName, jDefinition, strCreate);
///             Json::Value jRecord;
///             Json::Value jStored;
///             jRecord["id"] = 1;
///             if (0 > task.recCreate(jRecord, jStored)) {
///                 std::string strMessage = task.getErrMsg();
///                 puts(strMessage.empty() ? "failed, see the log" : strMessage.c_str());
///             }
///         }
///         sqlite3_close(pDb);
///     }
///
/// Results: every operation returns an int, negative on failure. Each failed check is logged with
/// the source text of its condition. Outputs are written only on success, unless stated otherwise.
///
/// Threads: any number of threads may use the library at once, as long as a connection, and the
/// handles on it, are used by one thread at a time. The library takes no locks. Change member types
/// through the reference of recType(), and the two flags, only while no other thread is in it. Do
/// not cancel a thread inside a call (see pthread_setcancelstate(3)). In any thread, do not call
/// the library while one of its statements is running: a handle constructed at that point takes
/// over the table name for the remaining rows.
///
/// Exceptions: the only exception that the library itself throws is std::logic_error, from
/// SqlExpandMemberSymbol(), recSave() and recCreate(), if a value list is too long. If a jsoncpp
/// accessor is called on a value of the wrong kind, such as a string in an integer member passed to
/// recSave(), its Json::LogicError reaches the host. Records and result arrays are then unchanged.
/// A string that an SQL builder was appending to keeps what was already appended, unless the
/// builder's description says that it is unchanged. The handle and the connection remain usable.
///
/// Memory: when memory runs out, a call may return -1, or the host may get std::bad_alloc,
/// jsoncpp's Json::RuntimeError or (from a value list) std::logic_error. Either way a row may have
/// been written, and the handle and the connection remain usable. After -1, outputs are as
/// described for each function. After an exception they are unchanged, except for those that are
/// built step by step, which may be in any state between old and new: the array of recList(), the
/// records of fillDefaultValue(), VORN_JSON_DB::jsonCopyMember(), VectorParamToJson() and, when it
/// merges, recGetOne(), and the strings of SqlExpandMemberName(), SqlExpandMemberList() and
/// SqlFilterConditionFromJson().
///
/// Ownership: the host owns the connection and every argument. A handle copies the name, the
/// definition and the CREATE statement; it neither opens nor closes the connection, which must
/// outlive it.
#ifndef VORNJSONDBAPI_H
#define VORNJSONDBAPI_H

#include <json/json.h>
#include <sqlite3.h>

#include <string>
#include <vector>

/// Marks the symbols that the shared library exports.
#define VORN_JSON_DB_EXPORT __attribute__((visibility("default")))

/// The two flags that control the log. The library only declares them: the host program defines
/// both in a source file that includes this header, which gives them the visibility they need even
/// under -fvisibility=hidden. They are read again for every line.
///
/// True: log lines go to standard output. False: to syslog at priority LOG_ERR.
extern VORN_JSON_DB_EXPORT bool blLogToStdout;
/// True: also log trace lines, which do not report failures.
extern VORN_JSON_DB_EXPORT bool blDebugOutput;

/// How SqlExpandMemberList() joins its terms.
enum {
    VORN_SQL_WHERE_TYPE_OR = 0,    ///< ` (a or b )`
    VORN_SQL_WHERE_TYPE_AND = 1,   ///< ` (a and b )`
    VORN_SQL_WHERE_TYPE_COMMA = 2  ///< `a , b`
};

namespace VORN_JSON_DB {

/// The member types of one table, read once from a table definition and cached for the life of the
/// process.
///
/// @p jTableDef looks like this:
///
///     {"task": {"member": {"id":   {"cpptype": "long long"},
///                          "name": {"cpptype": "string", "cppDefaultValue": "unnamed"}}}}
///
/// "cppDefaultValue" may be any JSON value or be absent; other keys are ignored, and one document
/// may define several tables. For each member of the table @p strJsonName, the result holds its
/// "cpptype" and, if present, its "cppDefaultValue":
///
///     {"id":   {"cpptype": "long long"},
///      "name": {"cpptype": "string", "cppDefaultValue": "unnamed"}}
///
/// The first definition read for a table name applies to the whole process, including other handles
/// and databases. A definition that is unusable is logged. It leaves null under the name, or the
/// members before the first one without a "cpptype" string; later calls return that same entry. The
/// cache of member types is never destroyed, so the reference stays valid until the process ends.
///
/// The host may change a type word through the reference while no other thread uses the library;
/// the change takes effect with the next statement. If it damages a member there, so that it has no
/// "cpptype" or is not even an object, the library leaves the member alone and treats its type word
/// as unknown.
VORN_JSON_DB_EXPORT Json::Value& recType(Json::Value& jTableDef, std::string& strJsonName);

/// Copies the members of the object @p jSubSet into @p jIn, which is an object or null: those that
/// @p jIn lacks, and, if @p blOverwrite is true, also those that it already has. Members are copied
/// whole, not merged. @p jIn may be part of @p jSubSet, but @p jSubSet must not be part of @p jIn.
/// Returns 0, or -1 with @p jIn unchanged if either argument is of another kind.
VORN_JSON_DB_EXPORT int jsonCopyMember(Json::Value& jIn, Json::Value& jSubSet, bool blOverwrite);

/// Sets @p now to the seconds since the epoch plus @p offsetSecond. Returns 0.
VORN_JSON_DB_EXPORT int getTimeAfterNow(int offsetSecond, long& now);

/// Sets @p strOut to the current time plus @p offsetSecond seconds, formatted by
/// convert2ReadableTime(). Returns 0, or -1 with @p strOut unchanged.
VORN_JSON_DB_EXPORT int getTimeAfterNow(int offsetSecond, std::string& strOut, int iType);

/// Sets @p strOut to @p ullTimeStamp, given in seconds since the epoch, as text. Only these bits of
/// @p iType are used:
///
/// - 1: UTC, otherwise local time
/// - 2: `Thu, 01 Jan 1970 00:00:00 GMT`, with the letters GMT even for local time; takes precedence
///   over 4
/// - 4: `1970-01-01 00:00:00`
///
/// So use 3, 4 or 5. The names of days and months follow the host's locale. Returns 0, or -1 with
/// @p strOut unchanged for a time that the calendar cannot represent or when neither 2 nor 4 is
/// set.
VORN_JSON_DB_EXPORT int convert2ReadableTime(long ullTimeStamp, std::string& strOut, int iType);

}  // namespace VORN_JSON_DB

/// One SQLite table as a store of JSON records.
class VORN_JSON_DB_EXPORT VornJsonDbApi {
public:
    /// Binds the open connection @p pDb to the table @p strName as @p jTableDef defines it (see
    /// VORN_JSON_DB::recType for its shape) and runs @p strSqlCreate, which should succeed if the
    /// table already exists (`create table if not exists ...`).
    ///
    /// A null connection, an empty argument or a failing CREATE statement is only logged: the
    /// handle is still created, its getErrMsg() is empty, and its operations fail on their own.
    VornJsonDbApi(sqlite3* pDb, std::string& strName, Json::Value& jTableDef,
                  std::string& strSqlCreate);

    /// Leaves the connection open.
    ~VornJsonDbApi();

    VornJsonDbApi(const VornJsonDbApi&) = delete;
    VornJsonDbApi& operator=(const VornJsonDbApi&) = delete;

    /// Runs the CREATE statement again. Returns 0, or -1 if it fails.
    int tableCreate();

    /// Replaces the message that getErrMsg() returns.
    void setErrMsg(std::string strMsg);

    /// The message for the host's user: empty in a new handle, and "DUPLICATE_PRIMARY_KEY" after a
    /// call of recCreate() or recUpdateByFilter() has violated a UNIQUE or PRIMARY KEY constraint.
    /// If other connections lock the database, the duplicate may be a row written by an earlier
    /// attempt of the same call; a transaction in the host prevents this.
    ///
    /// Only setErrMsg() clears it. Read it only after a result of -1, and call setErrMsg("") before
    /// the operation, because a later failure of another kind leaves the message in place.
    std::string getErrMsg();

    /// Runs @p strSql, which contains one or more SQL statements, on the handle's connection.
    ///
    /// @p callback and @p arg are passed to sqlite3_exec; the host's callback must not throw.
    /// Without a callback, the result is the number of rows changed by the connection's last
    /// INSERT, UPDATE or DELETE; with a callback, it is 0. On failure it is -1.
    ///
    /// While the database is locked, the whole text is tried again, up to 500 times with a pause of
    /// 10 ms after each attempt, so a call may block for five seconds or more. Statements in the
    /// text that had already succeeded then run again: wrap them in a transaction if that matters.
    int runSqlEx(std::string strSql, int (*callback)(void*, int, char**, char**) = nullptr,
                 void* arg = nullptr);

    /// Adds to @p jParam the "cppDefaultValue" of every declared member that it lacks. A member
    /// that is present is kept, even if it is null; a member without a default is not added.
    /// Returns 0.
    ///
    /// If @p blCheckOnly is true, nothing is changed, and the result is 0 if every declared member
    /// is present; otherwise it is -1, and the first missing name is logged. A value that is
    /// neither an object nor null counts as a record without members and is not changed.
    int fillDefaultValue(Json::Value& jParam, bool blCheckOnly);

    /// Checks that every declared member of the object @p jRecParam has the kind of its "cpptype".
    ///
    /// It knows "int", "long long", "uid_t", "time_t" (an integral number), "bool", "string",
    /// "Json::arrayValue" and "Json::objectValue"; a member with any other type word fails.
    /// Undeclared members are not checked. Returns 0, or -1 at the first bad member.
    int checkJsonType(Json::Value& jRecParam);

    /// Writes the declared members of @p jRecInOut as one row, using INSERT if @p blCreate is true
    /// and REPLACE otherwise, and replaces @p jRecInOut with the row as stored. It does not fill in
    /// defaults or check types. The record must contain the declared member whose name sorts last
    /// (byte by byte).
    ///
    /// Returns 0, or -1 with @p jRecInOut unchanged. -1 does not always mean that nothing was
    /// written: the row may be there even though it could not be read back.
    int recSave(Json::Value& jRecInOut, bool blCreate);

    /// Inserts a copy of the object @p jRecIn, with its defaults filled in and its types checked,
    /// and sets @p jRecOut to the stored row. @p jRecIn is not changed.
    ///
    /// Returns 0, or -1 with @p jRecOut unchanged. getErrMsg() is then "DUPLICATE_PRIMARY_KEY" if
    /// the last SQL failure of this handle was a violated UNIQUE constraint, even if this call
    /// failed before it ran any SQL. An integer that does not fit into 64 bits passes the type
    /// check and then throws.
    int recCreate(Json::Value& jRecIn, Json::Value& jRecOut);

    /// Appends every record that the request @p jRecParam selects to @p jRecArrayOut, which is an
    /// array, or null, which becomes an array with the first record. The array is not cleared
    /// first.
    ///
    /// The request is null or an object with any of these members:
    ///
    /// - `{"member": value}`: the member equals the value;
    /// - `{"member": [value]}`: the member equals the value in the list. Give only one item,
    ///   because several are written without commas between them;
    /// - `{"vornSqlWhereFilter": "id > 5"}`: SQL of the host, used unchanged;
    /// - `{"sort_by": "name", "sort_direction": "desc"}`: written as a string literal, so SQLite
    ///   does not order by the column;
    /// - `{"limit": 10, "offset": 20}`: paging; "offset" has an effect only with "limit".
    ///
    /// Terms are joined by "and". Members that the table does not declare are ignored. A member
    /// that is NULL in the row is left out of the record.
    ///
    /// Returns 0 for any number of records, or -1. On failure, the records decoded so far stay in
    /// the array; the last one may lack members if memory ran out.
    int recList(Json::Value& jRecParam, Json::Value& jRecArrayOut);

    /// Copies the first record that recList() gives for @p jRecParam into @p jRecOut, an object or
    /// null; members of @p jRecOut that the record lacks are kept. Every match is read, so pass
    /// "limit": 1.
    ///
    /// Returns 1, or 0 if nothing matched, or -1. If it returns 0 or -1, @p jRecOut is unchanged.
    int recGetOne(Json::Value& jRecParam, Json::Value& jRecOut);

    /// Sets the members of the object @p jRecIn in every row that meets the SQL condition @p
    /// strSqlWhere, which is used unchanged. Types are not checked. Undeclared members and
    /// "vornSqlWhereFilter" are ignored. An array becomes a membership term, which SQLite does not
    /// accept after SET, so save the whole record instead.
    ///
    /// Returns 0, even if no row matched, or -1. An empty condition or record is rejected.
    int recUpdateByWhere(Json::Value& jRecIn, std::string& strSqlWhere);

    /// Checks the object @p jParamIn as checkJsonType() does, and sets its members in every row
    /// that the conditions of the object @p jFilterIn select (as in recList(), but without paging).
    ///
    /// Returns 0, even if no row matched, or -1. A filter without a condition is rejected. On
    /// failure, getErrMsg() is set as by recCreate().
    int recUpdateByFilter(Json::Value& jFilterIn, Json::Value& jParamIn);

    /// Deletes the rows that the conditions of the object @p jRecParam select (as in recList(), but
    /// without paging). A request without a condition deletes every row if @p blDeleteAll is true;
    /// otherwise it is rejected. Returns the number of rows deleted, or -1.
    int recDelete(Json::Value& jRecParam, bool blDeleteAll = false);

    /// Deletes every row. Returns the number of rows deleted, or -1.
    int recDeleteAll();

    /// Deletes the rows whose member @p szKey, declared as "string", is in @p strVector, which must
    /// not be empty. Give only one item, as in a list passed to recList(). Returns the number of
    /// rows deleted, or -1.
    int recDeleteByArray(std::vector<std::string>& strVector, const char* szKey);

    /// Deletes the rows whose member @p szKey, declared as "string", equals @p strValue, which must
    /// not be empty. Returns the number of rows deleted, or -1.
    int recDeleteByName(std::string& strValue, const char* szKey);

    /// Appends the column list `a,b,c` to @p sql: all declared members, or only those that the
    /// record @p rec contains. Returns 0.
    ///
    /// If the record lacks the last declared member, the list ends in a comma. A table that is
    /// missing from the definition is added as null to the handle's copy of it, and nothing is
    /// appended.
    int SqlExpandMemberName(std::string& sql, Json::Value* rec = nullptr);

    /// Appends to @p sql the value list that goes with SqlExpandMemberName(sql, &rec), and closes
    /// it with ") " after the last declared member. Returns 0, or -1 with @p sql unchanged; @p sql
    /// is also unchanged if an accessor throws. If the record lacks the last declared member, the
    /// list ends in a comma; if the table has no members, nothing is appended.
    ///
    /// Strings are escaped, integers and other numbers (with six decimals) are written without
    /// quotes, and objects and arrays become JSON text. When a value is appended, any "%" in the
    /// text so far, including earlier values, is treated as a conversion of sqlite3_mprintf, so
    /// such members are not stored faithfully. Text that is too long for sqlite3_mprintf
    /// (1,000,000,000 bytes by default) throws std::logic_error.
    int SqlExpandMemberSymbol(std::string& sql, Json::Value& rec);

    /// Appends the terms of the request @p jRecParam, an object or null, to @p out, joined as
    /// specified by @p andType (VORN_SQL_WHERE_TYPE_OR, _AND or _COMMA): ` (a='x' and b=1 )`.
    ///
    /// Returns 0, or 1 if the request has no condition and nothing was appended, or -1; what was
    /// appended before the failure then stays in @p out.
    int SqlExpandMemberList(Json::Value& jRecParam, std::string& out, int andType);

    /// Appends the equality term of one declared member to @p out: `name='O''Brien'`, `id=5`. Only
    /// strings and JSON are quoted; the text of a number is not checked. Returns 0, or -1 with @p
    /// out unchanged.
    int SqlMakeByMatchField(std::string& strField, Json::Value& jParam, std::string& out);

    /// Appends the membership term of one declared member to @p out: `name in ('x' )`; nothing for
    /// an empty array. Several items are written without commas between them. Returns 0, or -1 with
    /// @p out unchanged.
    int SqlMakeByListField(const char* szField, Json::Value& jList, std::string& out);

    /// Sets the member @p szKey of @p jParamOut, an object or null, to an array of the strings in
    /// @p strVector. Returns 0, or -1 with @p jParamOut unchanged.
    int VectorParamToJson(std::vector<std::string>& strVector, const char* szKey,
                          Json::Value& jParamOut);

    /// Appends the sorting and paging clause of the request @p jFilter, an object or null, to @p
    /// out: ` order by 'name' DESC LIMIT 10 OFFSET 20`. "limit" and "offset" are written as JSON
    /// text, unchecked. Returns 0, or -1 with @p out unchanged.
    int SqlFilterConditionFromJson(Json::Value& jFilter, std::string& out);

private:
    sqlite3* pDb = nullptr;
    std::string strName;
    Json::Value jTableDef;
    // Kept: the layout is part of the binary interface; never read.
    Json::Value jReserved;
    std::string strSqlCreate;
    std::string strSqlError;
    std::string strErrMsg;
};

#endif
