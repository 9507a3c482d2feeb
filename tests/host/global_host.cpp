// SPDX-License-Identifier: MIT
// A host whose handle is a global: it creates, lists and deletes records before main, in main and
// after it. The status tells which step failed.

#include <VornJsonDbApi.h>

#include <cstdlib>

bool blLogToStdout = true;
bool blDebugOutput = false;

namespace {

struct Connection {
    Connection()
    {
        if (SQLITE_OK != sqlite3_open(":memory:", &pDb)) std::_Exit(1);
        jDefinition["task"]["member"]["id"]["cpptype"] = "long long";
        jDefinition["task"]["member"]["data"]["cpptype"] = "Json::objectValue";
    }
    ~Connection()
    {
        if (SQLITE_OK != sqlite3_close(pDb)) std::_Exit(2);
    }

    sqlite3* pDb = nullptr;
    std::string strName = "task";
    std::string strCreate = "create table task (id integer primary key, data text)";
    Json::Value jDefinition;
};

// Older than the library's first use, so it is gone after whatever that use has made: what main
// took is still there.
struct Late {
    ~Late()
    {
        if ("long long" != (*pjTypes)["id"]["cpptype"].asString()) std::_Exit(6);
        Json::Value jNone;
        if (pjTypes != &VORN_JSON_DB::recType(jNone, strName)) std::_Exit(7);
    }

    std::string strName = "first used in main";
    const Json::Value* pjTypes = nullptr;
};

Late late;

class Host {
public:
    Host()
        : api_(connection_.pDb, connection_.strName, connection_.jDefinition, connection_.strCreate)
    {
        if (!works(1)) std::_Exit(3);
    }
    ~Host()
    {
        if (!works(3)) std::_Exit(4);
    }

    // Whether a record comes back as it was created, in a list too, and can be deleted.
    bool works(int iId)
    {
        Json::Value jRecord;
        Json::Value jStored;
        jRecord["id"] = Json::Int64(iId);
        jRecord["data"]["key"] = "value";
        if (0 != api_.recCreate(jRecord, jStored) || jRecord != jStored) return false;
        Json::Value jAll(Json::objectValue);
        Json::Value jRecords(Json::arrayValue);
        if (0 != api_.recList(jAll, jRecords)) return false;
        return 1U == jRecords.size() && jRecord == jRecords[0U] && 1 == api_.recDeleteAll();
    }

private:
    Connection connection_;
    VornJsonDbApi api_;
};

Host host;

}  // namespace

int main()
{
    Json::Value jDefinition;
    jDefinition[late.strName]["member"]["id"]["cpptype"] = "long long";
    late.pjTypes = &VORN_JSON_DB::recType(jDefinition, late.strName);
    return host.works(2) ? 0 : 5;
}
