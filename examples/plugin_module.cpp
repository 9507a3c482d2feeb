// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
/// @file
/// The plugin of plugin.cpp: one function, which stores a note. It is linked with the library and
/// does not define the flags, because the program does.
#include <VornJsonDbApi.h>

#include <memory>

// Adds a note unless there is one with this title; gives the number of notes, or -1.
extern "C" VORN_JSON_DB_EXPORT int addNote(const char* szTitle);

namespace {

// The database and its table, until the plugin is unloaded; the handle goes before the connection.
class Notes {
public:
    Notes()
    {
        if (SQLITE_OK != sqlite3_open(":memory:", &pDb_)) return;
        std::string strName = "note";
        std::string strCreate = "create table if not exists note (title text primary key)";
        Json::Value jDefinition;
        jDefinition[strName]["member"]["title"]["cpptype"] = "string";
        pApi_ = std::make_unique<VornJsonDbApi>(pDb_, strName, jDefinition, strCreate);
        if (0 > pApi_->tableCreate()) pApi_.reset();
    }

    ~Notes()
    {
        pApi_.reset();
        sqlite3_close(pDb_);  // cannot fail: no statement is open
    }

    Notes(const Notes&) = delete;
    Notes& operator=(const Notes&) = delete;

    int add(const char* szTitle)
    {
        if (!pApi_) return -1;
        Json::Value jNote;
        Json::Value jStored;
        jNote["title"] = szTitle;
        pApi_->setErrMsg("");
        if (0 > pApi_->recCreate(jNote, jStored) && "DUPLICATE_PRIMARY_KEY" != pApi_->getErrMsg())
            return -1;
        Json::Value jAll(Json::objectValue);
        Json::Value jNotes(Json::arrayValue);
        return 0 > pApi_->recList(jAll, jNotes) ? -1 : static_cast<int>(jNotes.size());
    }

private:
    sqlite3* pDb_ = nullptr;
    std::unique_ptr<VornJsonDbApi> pApi_;
};

}  // namespace

int addNote(const char* szTitle)
{
    static Notes notes;
    return notes.add(szTitle);
}
