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
/// Threads: the library keeps process-wide state and takes no locks. Use it from one thread at a
/// time, all handles together; two at once corrupt the memory of the process. Do not call it while
/// one of its statements runs, either: a handle that is constructed then takes over the table name
/// for the rows that follow.
///
/// Exceptions: the library throws nothing of its own but std::logic_error for a value list that is
/// too long, from SqlExpandMemberSymbol(), recSave() and recCreate(). Where an accessor of jsoncpp
/// meets a value of the wrong kind, such as a text under an integer member in recSave(), its
/// Json::LogicError reaches the host; records and result arrays are then as they were, and a text
/// that an SQL builder was appending to keeps what was appended before, except where the builder
/// says that it is unchanged. After each of them handle and connection are sound.
///
/// Memory: when it runs out, a call may return -1, or std::bad_alloc, jsoncpp's Json::RuntimeError
/// or (in a value list) std::logic_error reaches the host; either way a write may have been made,
/// and handle and connection are sound. Outputs are after -1 as each function says. Where one of
/// these is thrown, they are as before, but for those that are made step by step, which may be
/// anywhere between before and after: the array of recList(), the records of fillDefaultValue(),
/// VORN_JSON_DB::jsonCopyMember(), VectorParamToJson() and, where it merges, recGetOne(), and the
/// texts of SqlExpandMemberName(), SqlExpandMemberList() and SqlFilterConditionFromJson().
///
/// Ownership: the host owns the connection and every argument. A handle copies the name, the
/// definition and the CREATE statement; it neither opens nor closes the connection, which has to
/// outlive the handle.
#ifndef VORNJSONDBAPI_H
#define VORNJSONDBAPI_H

#include <json/json.h>
#include <sqlite3.h>

#include <string>
#include <vector>

/// Marks what the shared library exports.
#define VORN_JSON_DB_EXPORT __attribute__((visibility("default")))

/// The two flags that steer the log. The library only declares them: the host program defines both,
/// in a source file that includes this header (which gives them the visibility they need, also
/// under -fvisibility=hidden). They are read afresh for every line.
///
/// True: log lines go to standard output. False: to syslog at priority LOG_ERR.
extern VORN_JSON_DB_EXPORT bool blLogToStdout;
/// True: also log trace lines, which report no failure.
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
/// The first definition that is read under a table name wins for the whole process, also for other
/// handles and databases. A definition without usable members is logged and leaves null under the
/// name, or the members before the first that has no "cpptype" text; later calls return that entry
/// again. The cache of member types is never destroyed: the reference stays valid until the process
/// ends.
///
/// A type word that a host changes through the reference holds from the next statement on. A member
/// that a host has damaged there, without a "cpptype" or not even an object, is left as it is and
/// has an unknown type word.
VORN_JSON_DB_EXPORT Json::Value& recType(Json::Value& jTableDef, std::string& strJsonName);

/// Copies the members of the object @p jSubSet into @p jIn, which is an object or null: those that
/// @p jIn lacks, and with @p blOverwrite also those that it has. Members are copied whole, not
/// merged. @p jIn may lie inside @p jSubSet, but @p jSubSet must not lie anywhere inside @p jIn.
/// Returns 0, or -1 with @p jIn unchanged when one of the two is of another kind.
VORN_JSON_DB_EXPORT int jsonCopyMember(Json::Value& jIn, Json::Value& jSubSet, bool blOverwrite);

/// Sets @p now to the seconds since the epoch plus @p offsetSecond. Returns 0.
VORN_JSON_DB_EXPORT int getTimeAfterNow(int offsetSecond, long& now);

/// Sets @p strOut to the present time plus @p offsetSecond seconds as convert2ReadableTime() writes
/// it. Returns 0, or -1 with @p strOut unchanged.
VORN_JSON_DB_EXPORT int getTimeAfterNow(int offsetSecond, std::string& strOut, int iType);

/// Sets @p strOut to @p ullTimeStamp, in seconds since the epoch, as text. Of the bit set @p iType
/// only these are read:
///
/// - 1: UTC, otherwise local time
/// - 2: `Thu, 01 Jan 1970 00:00:00 GMT`, the letters GMT also after local time; wins over 4
/// - 4: `1970-01-01 00:00:00`
///
/// So 3, 4 and 5 say what they mean. Names of days and months follow the host's locale. Returns 0,
/// or -1 with @p strOut unchanged for a time beyond what the calendar holds or a set without 2
/// and 4.
VORN_JSON_DB_EXPORT int convert2ReadableTime(long ullTimeStamp, std::string& strOut, int iType);

}  // namespace VORN_JSON_DB

/// One SQLite table as a store of JSON records.
class VORN_JSON_DB_EXPORT VornJsonDbApi {
public:
    /// Binds the open connection @p pDb to the table @p strName as @p jTableDef defines it (the
    /// shape stands at VORN_JSON_DB::recType) and runs @p strSqlCreate, which should succeed when
    /// the table exists already (`create table if not exists ...`).
    ///
    /// A null connection, an empty argument or a CREATE statement that fails is logged only: the
    /// handle is made, its getErrMsg() is empty, and its operations fail on their own.
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
    /// recCreate() or recUpdateByFilter() met a violated UNIQUE or PRIMARY KEY constraint. Where
    /// other connections lock the database, the duplicate may be the row that an earlier attempt of
    /// the same call wrote; a transaction of the host prevents this.
    ///
    /// Nothing but setErrMsg() clears it. Look at it only after a result of -1, and call
    /// setErrMsg("") before the operation: a later failure of another kind leaves it in place.
    std::string getErrMsg();

    /// Runs the SQL text @p strSql, one or more statements, on the handle's connection.
    ///
    /// @p callback and @p arg go to sqlite3_exec unchanged; a callback of the host must not throw.
    /// Without a callback the result is the number of rows that the last INSERT, UPDATE or DELETE
    /// of the connection changed, with one it is 0. Failure gives -1.
    ///
    /// While the database is locked the whole text is tried again, 500 times in all with 10 ms
    /// after each, so that a call may block for five seconds and more. Statements of the text that
    /// had succeeded run again then: put a transaction around them where that matters.
    int runSqlEx(std::string strSql, int (*callback)(void*, int, char**, char**) = nullptr,
                 void* arg = nullptr);

    /// Adds to @p jParam the "cppDefaultValue" of every declared member that it lacks and returns
    /// 0. A member that is present is kept, null included; members without a default stay away.
    ///
    /// With @p blCheckOnly nothing is changed, and the result is 0 when every declared member is
    /// present, otherwise -1 with the first missing name in the log. A record that is neither an
    /// object nor null has no members and is left alone.
    int fillDefaultValue(Json::Value& jParam, bool blCheckOnly);

    /// Checks that every declared member of the object @p jRecParam has the kind of its "cpptype".
    ///
    /// Known are "int", "long long", "uid_t", "time_t" (an integral number), "bool", "string",
    /// "Json::arrayValue" and "Json::objectValue"; a member of any other type word fails. Members
    /// that are not declared pass. Returns 0, or -1 at the first bad member.
    int checkJsonType(Json::Value& jRecParam);

    /// Writes the declared members of @p jRecInOut as one row, by INSERT when @p blCreate,
    /// otherwise by REPLACE, and replaces @p jRecInOut with the row as it is stored. No defaults
    /// and no type check are applied; the record has to hold the member that comes last in byte
    /// order.
    ///
    /// Returns 0, or -1 with @p jRecInOut unchanged. -1 does not always mean that nothing was
    /// written: the row may be there although it could not be read back.
    int recSave(Json::Value& jRecInOut, bool blCreate);

    /// Inserts the object @p jRecIn, completed by its defaults and type-checked, and sets @p
    /// jRecOut to the stored row. @p jRecIn is not changed.
    ///
    /// Returns 0, or -1 with @p jRecOut unchanged. getErrMsg() is then "DUPLICATE_PRIMARY_KEY" when
    /// the last SQL failure of this handle was a violated UNIQUE constraint, even if this call
    /// ended before it ran any SQL. An integer beyond 64 bits passes the type check and throws.
    int recCreate(Json::Value& jRecIn, Json::Value& jRecOut);

    /// Appends every record that the request @p jRecParam selects to the array @p jRecArrayOut (or
    /// null, which becomes an array with the first record). The array is not cleared.
    ///
    /// The request is null or an object, which may hold
    ///
    /// - `{"member": value}`: the member equals the value;
    /// - `{"member": [value]}`: the member is the value of the list. Give one item only: several
    ///   are written without a comma between them;
    /// - `{"vornSqlWhereFilter": "id > 5"}`: SQL of the host, as it stands;
    /// - `{"sort_by": "name", "sort_direction": "desc"}`: written as a text literal, so that SQLite
    ///   does not order by the column;
    /// - `{"limit": 10, "offset": 20}`: paging; "offset" counts only with "limit".
    ///
    /// Terms are joined by "and". Members that the table does not declare are ignored. A member
    /// that is NULL in the row is left out of its record.
    ///
    /// Returns 0 for any number of records, or -1; records decoded before the failure then stay,
    /// the last of them perhaps without members for which there was no memory.
    int recList(Json::Value& jRecParam, Json::Value& jRecArrayOut);

    /// Copies the first record that recList() gives for @p jRecParam into @p jRecOut, an object or
    /// null; members that the record lacks stay there. Every match is read: pass "limit" 1.
    ///
    /// Returns 1, 0 when nothing matched, or -1; @p jRecOut is unchanged for 0 and -1.
    int recGetOne(Json::Value& jRecParam, Json::Value& jRecOut);

    /// Sets the members of the object @p jRecIn in every row for which the SQL condition
    /// @p strSqlWhere, taken as it stands, holds. No types are checked. Members that are not
    /// declared are ignored, and so is "vornSqlWhereFilter"; an array becomes a membership term,
    /// which no SET list takes: save the whole record instead.
    ///
    /// Returns 0, also when no row matched, or -1. An empty condition or record is refused.
    int recUpdateByWhere(Json::Value& jRecIn, std::string& strSqlWhere);

    /// Sets the members of the object @p jParamIn, type-checked as by checkJsonType(), in every row
    /// that the conditions of the object @p jFilterIn select (as in recList(), without paging).
    ///
    /// Returns 0, also when no row matched, or -1. A filter that selects by nothing is refused.
    /// getErrMsg() is set on failure as by recCreate().
    int recUpdateByFilter(Json::Value& jFilterIn, Json::Value& jParamIn);

    /// Deletes the rows that the conditions of the object @p jRecParam select (as in recList(),
    /// without paging). A request that selects by nothing deletes every row when @p blDeleteAll,
    /// otherwise it is refused. Returns the number of rows deleted, or -1.
    int recDelete(Json::Value& jRecParam, bool blDeleteAll = false);

    /// Deletes every row. Returns the number of rows deleted, or -1.
    int recDeleteAll();

    /// Deletes the rows whose member @p szKey, declared "string", is in @p strVector, which must
    /// not be empty; give one item only, as in a list of recList(). Returns the number of rows
    /// deleted, or -1.
    int recDeleteByArray(std::vector<std::string>& strVector, const char* szKey);

    /// Deletes the rows whose member @p szKey, declared "string", equals @p strValue, which must
    /// not be empty. Returns the number of rows deleted, or -1.
    int recDeleteByName(std::string& strValue, const char* szKey);

    /// Appends the column list `a,b,c` to @p sql: the declared members, or those of them that the
    /// record @p rec holds. Returns 0.
    ///
    /// A record that lacks the last declared member gives a list that ends with a comma. A table
    /// that the definition lacks is added to the handle's copy of it as null and lists nothing.
    int SqlExpandMemberName(std::string& sql, Json::Value* rec = nullptr);

    /// Appends the value list that goes with SqlExpandMemberName(sql, &rec) to @p sql, closed by
    /// ") " behind the last declared member. Returns 0, or -1 with @p sql unchanged, as it also is
    /// when an accessor throws. A record without that member gives a list that ends with a comma, a
    /// table without members gives nothing.
    ///
    /// Text is escaped, integers and numbers (six decimals) are bare, objects and arrays become
    /// JSON text. A "%" in the text so far, earlier values included, is read as a conversion of
    /// sqlite3_mprintf by every value that follows: such members are not written faithfully. A text
    /// that is too long for sqlite3_mprintf (1,000,000,000 bytes by default) throws
    /// std::logic_error.
    int SqlExpandMemberSymbol(std::string& sql, Json::Value& rec);

    /// Appends the terms of the request @p jRecParam, an object or null, to @p out, joined as
    /// @p andType says (VORN_SQL_WHERE_TYPE_OR, _AND or _COMMA): ` (a='x' and b=1 )`.
    ///
    /// Returns 0, 1 when the request holds no condition and nothing was written, or -1 with what
    /// was appended before the failure left in @p out.
    int SqlExpandMemberList(Json::Value& jRecParam, std::string& out, int andType);

    /// Appends the equality term of one declared member to @p out: `name='O''Brien'`, `id=5`. Only
    /// text and JSON are quoted; the text of a number is not looked at. Returns 0, or -1 with @p
    /// out unchanged.
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
    Json::Value jReserved;
    std::string strSqlCreate;
    std::string strSqlError;
    std::string strErrMsg;
};

#endif
