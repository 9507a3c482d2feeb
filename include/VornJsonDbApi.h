/// @file
/// JSON records in SQLite tables: the whole public interface of libvornjsondb.
///
/// A host opens an SQLite connection, makes one handle per table and works with records, which
/// are JSON objects whose keys are column names:
///
///     #include <VornJsonDbApi.h>
///     #include <sqlite3.h>
///
///     bool blLogToStdout = false;  // the host defines both flags
///     bool blDebugOutput = false;
///
///     sqlite3* pDb = nullptr;
///     sqlite3_open("tasks.db", &pDb);
///     std::string strName = "task";
///     std::string strCreate = "CREATE TABLE IF NOT EXISTS task (id INTEGER PRIMARY KEY, name
///     TEXT)"; Json::Value jDef; jDef["task"]["member"]["id"]["cpptype"] = "int";
///     jDef["task"]["member"]["name"]["cpptype"] = "string";
///     jDef["task"]["member"]["name"]["cppDefaultValue"] = "unnamed";
///     {
///         VornJsonDbApi task(pDb, strName, jDef, strCreate);
///         Json::Value jRec, jStored;
///         jRec["id"] = 1;
///         if (0 > task.recCreate(jRec, jStored)) { ... task.getErrMsg() ... }
///     }
///     sqlite3_close(pDb);
///
/// Results: every operation returns an int, negative on failure. Each failed check is logged with
/// the source text of its condition. Outputs are written only on success unless said otherwise.
///
/// Threads: the library keeps process-wide state and takes no locks. Use it from one thread at a
/// time, all handles together.
///
/// Exceptions: the library throws nothing of its own. What reaches the host is std::bad_alloc (and
/// jsoncpp's Json::RuntimeError) when memory runs out, std::logic_error where SQLite found no
/// memory for a value list, and Json::LogicError where an accessor of jsoncpp meets a value of the
/// wrong kind, such as a text under an integer member in recSave. Handle, connection, records and
/// result arrays are then as they were; a text that an SQL builder was appending to keeps what was
/// appended before, except where the builder says that it is unchanged.
///
/// Ownership: the host owns the connection and every argument. A handle copies the name, the
/// definition and the CREATE statement; it neither opens nor closes the connection, which has to
/// outlive the handle.
#ifndef VORNJSONDBAPI_H
#define VORNJSONDBAPI_H

#include <json/value.h>

#include <string>

/// Marks what the shared library exports.
#define VORN_JSON_DB_EXPORT __attribute__((visibility("default")))

struct sqlite3;

/// The two flags that steer the log. The library only declares them: the host program defines both,
/// in a source file that includes this header (which gives them the visibility they need, also
/// under -fvisibility=hidden). They are read afresh for every line.
///
/// True: log lines go to standard output. False: to syslog at priority LOG_ERR.
extern VORN_JSON_DB_EXPORT bool blLogToStdout;
/// True: also log trace lines, which report no failure.
extern VORN_JSON_DB_EXPORT bool blDebugOutput;

namespace VORN_JSON_DB {

/// The member types of one table, read from a table definition once and kept for the life of the
/// process.
///
/// @p jTableDef has the shape
///
///     {"task": {"member": {"id":   {"cpptype": "int"},
///                          "name": {"cpptype": "string", "cppDefaultValue": "unnamed"}}}}
///
/// where "cppDefaultValue" may be any JSON value or be absent; other keys are ignored and one
/// document may define several tables. The result holds, for each member of the table
/// @p strJsonName, its "cpptype" and, where given, its "cppDefaultValue":
///
///     {"id": {"cpptype": "int"}, "name": {"cpptype": "string", "cppDefaultValue": "unnamed"}}
///
/// The first definition that is read under a table name wins for the whole process, also for other
/// handles and databases. A definition without usable members is logged and leaves null under the
/// name, or the members before the first that has no "cpptype" text; later calls return that entry
/// again. The reference stays valid until the process ends; what a host changes through it holds
/// from the next statement on.
VORN_JSON_DB_EXPORT Json::Value& recType(Json::Value& jTableDef, std::string& strJsonName);

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

    /// The message for the host's user: empty in a new handle, "DUPLICATE_PRIMARY_KEY" after an
    /// operation met a violated UNIQUE or PRIMARY KEY constraint.
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
    /// jRecOut to the row as it is stored. @p jRecIn is never changed.
    ///
    /// Returns 0, or -1 with @p jRecOut unchanged. getErrMsg() is then "DUPLICATE_PRIMARY_KEY" when
    /// the last SQL failure of this handle was a violated UNIQUE constraint, even if this call
    /// ended before it ran any SQL.
    int recCreate(Json::Value& jRecIn, Json::Value& jRecOut);

    /// Appends the column list `a,b,c` to @p sql: the declared members, or those of them that the
    /// record @p rec holds. Returns 0.
    ///
    /// A record that lacks the last declared member gives a list that ends with a comma. A table
    /// that the definition lacks is added to the handle's copy of it as null and lists nothing.
    int SqlExpandMemberName(std::string& sql, Json::Value* rec = nullptr);

    /// Appends the value list that goes with SqlExpandMemberName(sql, &rec) to @p sql, closed by
    /// ") ". Returns 0, or -1 with @p sql unchanged, as it also is when an accessor throws.
    ///
    /// Text is escaped, integers and numbers (six decimals) are bare, objects and arrays become
    /// JSON text. A "%" in the text so far, earlier values included, is read as a conversion of
    /// sqlite3_mprintf by every value that follows: such members are not written faithfully.
    int SqlExpandMemberSymbol(std::string& sql, Json::Value& rec);

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
