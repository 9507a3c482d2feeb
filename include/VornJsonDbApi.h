// SPDX-License-Identifier: MIT
/// @file
/// JSON records in SQLite tables: the whole public interface of libvornjsondb.
///
/// A host opens an SQLite connection, makes one handle per table and works with records, which
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
/// the source text of its condition. Outputs are written only on success unless said otherwise.
///
/// Threads: the library keeps process-wide state and takes no locks. Only one thread may use it at
/// a time, whichever handles it uses; two at once corrupt the memory of the process. Do not call it
/// while one of its statements runs either: a handle constructed then takes over the table name for
/// the rows that follow.
///
/// Exceptions: the only exception of the library's own is std::logic_error, for a value list that
/// is too long, from SqlExpandMemberSymbol(), recSave() and recCreate(). When an accessor of
/// jsoncpp meets a value of the wrong kind, such as a text under an integer member in recSave(),
/// its Json::LogicError reaches the host. Records and result arrays are then unchanged, and a text
/// that an SQL builder was appending to keeps what was already appended, unless the builder says
/// that it is unchanged. The handle and the connection remain usable.
///
/// Memory: when it runs out, a call may return -1, or std::bad_alloc, jsoncpp's Json::RuntimeError
/// or (in a value list) std::logic_error reaches the host. Either way a row may have been written,
/// and the handle and the connection remain usable. After -1, outputs are as each function says.
/// After an exception they are unchanged, except for those that are built step by step, which may
/// be anywhere between their old and their new state: the array of recList(), the records of
/// fillDefaultValue(), VORN_JSON_DB::jsonCopyMember(), VectorParamToJson() and, when it merges,
/// recGetOne(), and the texts of SqlExpandMemberName(), SqlExpandMemberList() and
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

/// Marks what the shared library exports.
#define VORN_JSON_DB_EXPORT __attribute__((visibility("default")))

/// The two flags that control the log. The library only declares them: the host program defines
/// both in a source file that includes this header, which gives them the visibility they need even
/// under -fvisibility=hidden. They are read anew for every line.
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

/// The member types of one table, read from a table definition once and kept for the life of the
/// process.
///
/// @p jTableDef has the shape
///
///     {"task": {"member": {"id":   {"cpptype": "long long"},
///                          "name": {"cpptype": "string", "cppDefaultValue": "unnamed"}}}}
///
/// where "cppDefaultValue" may be any JSON value or be absent; other keys are ignored and one
/// document may define several tables. The result holds, for each member of the table
/// @p strJsonName, its "cpptype" and, where given, its "cppDefaultValue":
///
///     {"id":   {"cpptype": "long long"},
///      "name": {"cpptype": "string", "cppDefaultValue": "unnamed"}}
///
/// The first definition that is read under a table name wins for the whole process, for other
/// handles and databases too. A definition without usable members is logged and leaves null under
/// the name, or the members before the first one that has no "cpptype" text; later calls return
/// that entry again. The cache of member types is never destroyed: the reference stays valid until
/// the process ends.
///
/// A type word that a host changes through the reference takes effect with the next statement. A
/// member that a host has damaged there, one without a "cpptype" or not even an object, is left
/// alone and has an unknown type word.
VORN_JSON_DB_EXPORT Json::Value& recType(Json::Value& jTableDef, std::string& strJsonName);

/// Copies the members of the object @p jSubSet into @p jIn, which is an object or null: those that
/// @p jIn lacks, and with @p blOverwrite also those that it has. Members are copied whole, not
/// merged. @p jIn may be part of @p jSubSet, but @p jSubSet must not be part of @p jIn. Returns 0,
/// or -1 with @p jIn unchanged if either is of another kind.
VORN_JSON_DB_EXPORT int jsonCopyMember(Json::Value& jIn, Json::Value& jSubSet, bool blOverwrite);

/// Sets @p now to the seconds since the epoch plus @p offsetSecond. Returns 0.
VORN_JSON_DB_EXPORT int getTimeAfterNow(int offsetSecond, long& now);

/// Sets @p strOut to the current time plus @p offsetSecond seconds as convert2ReadableTime() writes
/// it. Returns 0, or -1 with @p strOut unchanged.
VORN_JSON_DB_EXPORT int getTimeAfterNow(int offsetSecond, std::string& strOut, int iType);

/// Sets @p strOut to @p ullTimeStamp, in seconds since the epoch, as text. Only these bits of
/// @p iType are read:
///
/// - 1: UTC, otherwise local time
/// - 2: `Thu, 01 Jan 1970 00:00:00 GMT`, with the letters GMT even after local time; wins over 4
/// - 4: `1970-01-01 00:00:00`
///
/// So use 3, 4 or 5. Names of days and months follow the host's locale. Returns 0, or -1 with
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
    /// A null connection, an empty argument or a CREATE statement that fails is only logged: the
    /// handle is made, its getErrMsg() is empty, and its operations fail by themselves.
    VornJsonDbApi(sqlite3* pDb, std::string& strName, Json::Value& jTableDef,
                  std::string& strSqlCreate);

    /// Leaves the connection open.
    ~VornJsonDbApi();

    VornJsonDbApi(const VornJsonDbApi&) = delete;
    VornJsonDbApi& operator=(const VornJsonDbApi&) = delete;

    /// Runs the CREATE statement again. Returns 0, or -1 when it fails.
    int tableCreate();

    /// Replaces the message that getErrMsg() returns.
    void setErrMsg(std::string strMsg);

    /// The message for the host's user: empty in a new handle, "DUPLICATE_PRIMARY_KEY" after
    /// recCreate() or recUpdateByFilter() violated a UNIQUE or PRIMARY KEY constraint. When other
    /// connections lock the database, the duplicate may be the row that an earlier attempt of the
    /// same call wrote; a transaction of the host prevents this.
    ///
    /// Only setErrMsg() clears it. Read it only after a result of -1, and call setErrMsg("") before
    /// the operation: a later failure of another kind leaves it in place.
    std::string getErrMsg();

    /// Runs the SQL text @p strSql, one or more statements, on the handle's connection.
    ///
    /// @p callback and @p arg are passed to sqlite3_exec; a callback of the host must not throw.
    /// Without a callback the result is the number of rows that the last INSERT, UPDATE or DELETE
    /// of the connection changed; with one it is 0. On failure it is -1.
    ///
    /// While the database is locked, the whole text is tried again, up to 500 times with 10 ms
    /// after each attempt, so a call may block for five seconds or more. Statements of the text
    /// that had succeeded then run again: wrap them in a transaction if that matters.
    int runSqlEx(std::string strSql, int (*callback)(void*, int, char**, char**) = nullptr,
                 void* arg = nullptr);

    /// Adds to @p jParam the "cppDefaultValue" of every declared member that it lacks and returns
    /// 0. A member that is present is kept, even null; one without a default is not added.
    ///
    /// With @p blCheckOnly nothing is changed, and the result is 0 if every declared member is
    /// present, otherwise -1 with the first missing name in the log. A record that is neither an
    /// object nor null has no members and is left alone.
    int fillDefaultValue(Json::Value& jParam, bool blCheckOnly);

    /// Checks that every declared member of the object @p jRecParam has the kind of its "cpptype".
    ///
    /// It knows "int", "long long", "uid_t", "time_t" (an integral number), "bool", "string",
    /// "Json::arrayValue" and "Json::objectValue"; a member with any other type word fails. Members
    /// that are not declared pass. Returns 0, or -1 at the first bad member.
    int checkJsonType(Json::Value& jRecParam);

    /// Writes the declared members of @p jRecInOut as one row, by INSERT when @p blCreate,
    /// otherwise by REPLACE, and replaces @p jRecInOut with the row as stored. It neither fills in
    /// defaults nor checks types. The record must contain the declared member whose name sorts last
    /// (byte by byte).
    ///
    /// Returns 0, or -1 with @p jRecInOut unchanged. -1 does not always mean that nothing was
    /// written: the row may be there even though it could not be read back.
    int recSave(Json::Value& jRecInOut, bool blCreate);

    /// Inserts the object @p jRecIn, completed by its defaults and type-checked, and sets @p
    /// jRecOut to the stored row. @p jRecIn is not changed.
    ///
    /// Returns 0, or -1 with @p jRecOut unchanged. getErrMsg() is then "DUPLICATE_PRIMARY_KEY" if
    /// the last SQL failure of this handle was a violated UNIQUE constraint, even if this call
    /// failed before it ran any SQL. An integer beyond 64 bits passes the type check and throws.
    int recCreate(Json::Value& jRecIn, Json::Value& jRecOut);

    /// Appends every record that the request @p jRecParam selects to the array @p jRecArrayOut (or
    /// null, which becomes an array with the first record). The array is not cleared first.
    ///
    /// The request is null or an object, which may hold
    ///
    /// - `{"member": value}`: the member equals the value;
    /// - `{"member": [value]}`: the member is the value in the list. Give only one item: several
    ///   are written without a comma between them;
    /// - `{"vornSqlWhereFilter": "id > 5"}`: SQL of the host, used unchanged;
    /// - `{"sort_by": "name", "sort_direction": "desc"}`: written as a text literal, so SQLite does
    ///   not order by the column;
    /// - `{"limit": 10, "offset": 20}`: paging; "offset" counts only with "limit".
    ///
    /// Terms are joined by "and". Members that the table does not declare are ignored. A member
    /// that is NULL in the row is left out of its record.
    ///
    /// Returns 0 for any number of records, or -1. Records decoded before the failure then stay;
    /// the last one may lack members if memory ran out.
    int recList(Json::Value& jRecParam, Json::Value& jRecArrayOut);

    /// Copies the first record that recList() gives for @p jRecParam into @p jRecOut, an object or
    /// null; members that the record lacks stay there. Every match is read, so pass "limit" 1.
    ///
    /// Returns 1, 0 when nothing matched, or -1; @p jRecOut is unchanged for 0 and -1.
    int recGetOne(Json::Value& jRecParam, Json::Value& jRecOut);

    /// Sets the members of the object @p jRecIn in every row for which the SQL condition
    /// @p strSqlWhere, used unchanged, holds. Types are not checked. Members that are not declared
    /// are ignored, and so is "vornSqlWhereFilter". An array becomes a membership term, which
    /// SQLite does not accept after SET: save the whole record instead.
    ///
    /// Returns 0, even if no row matched, or -1. An empty condition or record is refused.
    int recUpdateByWhere(Json::Value& jRecIn, std::string& strSqlWhere);

    /// Sets the members of the object @p jParamIn, type-checked as by checkJsonType(), in every row
    /// that the conditions of the object @p jFilterIn select (as in recList(), without paging).
    ///
    /// Returns 0, even if no row matched, or -1. A filter without a condition is refused. On
    /// failure getErrMsg() is set as by recCreate().
    int recUpdateByFilter(Json::Value& jFilterIn, Json::Value& jParamIn);

    /// Deletes the rows that the conditions of the object @p jRecParam select (as in recList(),
    /// without paging). A request without a condition deletes every row if @p blDeleteAll is true,
    /// otherwise it is refused. Returns the number of rows deleted, or -1.
    int recDelete(Json::Value& jRecParam, bool blDeleteAll = false);

    /// Deletes every row. Returns the number of rows deleted, or -1.
    int recDeleteAll();

    /// Deletes the rows whose member @p szKey, declared "string", is in @p strVector, which must
    /// not be empty; give only one item, as in a list of recList(). Returns the number of rows
    /// deleted, or -1.
    int recDeleteByArray(std::vector<std::string>& strVector, const char* szKey);

    /// Deletes the rows whose member @p szKey, declared "string", equals @p strValue, which must
    /// not be empty. Returns the number of rows deleted, or -1.
    int recDeleteByName(std::string& strValue, const char* szKey);

    /// Appends the column list `a,b,c` to @p sql: the declared members, or only those that the
    /// record
    /// @p rec contains. Returns 0.
    ///
    /// A record without the last declared member gives a list that ends in a comma. A table that is
    /// missing from the definition is added to the handle's copy of it as null and lists nothing.
    int SqlExpandMemberName(std::string& sql, Json::Value* rec = nullptr);

    /// Appends the value list that goes with SqlExpandMemberName(sql, &rec) to @p sql, closed by
    /// ") " after the last declared member. Returns 0, or -1 with @p sql unchanged; it is unchanged
    /// when an accessor throws, too. A record without that member gives a list that ends in a
    /// comma, a table without members gives nothing.
    ///
    /// Text is escaped, integers and numbers (six decimals) are bare, objects and arrays become
    /// JSON text. Every value that follows reads a "%" in the text so far, earlier values included,
    /// as a conversion of sqlite3_mprintf, so such members are not stored faithfully. A text that
    /// is too long for sqlite3_mprintf (1,000,000,000 bytes by default) throws std::logic_error.
    int SqlExpandMemberSymbol(std::string& sql, Json::Value& rec);

    /// Appends the terms of the request @p jRecParam, an object or null, to @p out, joined as
    /// @p andType says (VORN_SQL_WHERE_TYPE_OR, _AND or _COMMA): ` (a='x' and b=1 )`.
    ///
    /// Returns 0, or 1 if the request has no condition and nothing was written, or -1, which leaves
    /// in @p out what was appended before the failure.
    int SqlExpandMemberList(Json::Value& jRecParam, std::string& out, int andType);

    /// Appends the equality term of one declared member to @p out: `name='O''Brien'`, `id=5`. Only
    /// text and JSON are quoted; the text of a number is not checked. Returns 0, or -1 with @p out
    /// unchanged.
    int SqlMakeByMatchField(std::string& strField, Json::Value& jParam, std::string& out);

    /// Appends the membership term of one declared member to @p out: `name in ('x' )`; nothing for
    /// an empty array. Several items are written without a comma. Returns 0, or -1 with @p out
    /// unchanged.
    int SqlMakeByListField(const char* szField, Json::Value& jList, std::string& out);

    /// Sets the member @p szKey of @p jParamOut, an object or null, to the array of the texts in
    /// @p strVector. Returns 0, or -1 with @p jParamOut unchanged.
    int VectorParamToJson(std::vector<std::string>& strVector, const char* szKey,
                          Json::Value& jParamOut);

    /// Appends the sorting and paging clause of the request @p jFilter, an object or null, to @p
    /// out: ` order by 'name' DESC LIMIT 10 OFFSET 20`. "limit" and "offset" are written as their
    /// JSON text, unchecked. Returns 0, or -1 with @p out unchanged.
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
