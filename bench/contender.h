// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// What is compared: a way for a host to keep JSON records in an SQLite table.
#pragma once

#include "workload.h"

#include <memory>
#include <string>
#include <vector>

namespace bench {

// Each contender, when it is made, opens an in-memory database of its own and makes the table. Its
// JSON may be of any library. An operation takes its JSON input, made before by makeInput(), and
// leaves what it returns to the host in the contender until the next operation.
class Contender {
public:
    virtual ~Contender() = default;

    virtual sqlite3* connection() = 0;
    // The records and requests of the operations on the records 1 to rows.
    virtual void makeInput(int rows) = 0;

    // Inserts the record and hands back the row as it is stored.
    virtual void create(int id) = 0;
    // The record that the request {"id":7} asks for.
    virtual void fetch(int id) = 0;
    // The array of the records that the request {"grp":"group 3"} asks for.
    virtual void listGroup(int group) = 0;
    // The array of all records.
    virtual void listAll() = 0;
    // Sets what {"name":"..."} holds in the record that {"id":7} asks for.
    virtual void update(int id) = 0;
    // Deletes the record that {"id":7} asks for.
    virtual void remove(int id) = 0;

    // What the last operation returned, null from the last two; not for use within a measurement.
    virtual Json::Value result() const = 0;
    virtual void dropResult() = 0;
};

// How the values of one JSON library are read and written, for the input and the comparison of the
// results: static J fromText(const std::string&), static std::string toText(const J&).
template <typename J>
struct JsonLibrary;

template <>
struct JsonLibrary<Json::Value> {
    static Json::Value fromText(const std::string& strText) { return bench::fromText(strText); }
    static std::string toText(const Json::Value& jValue) { return bench::toText(jValue); }
};

// A contender whose JSON values are of the type J.
template <typename J>
class JsonContender : public Contender {
public:
    void makeInput(int rows) override
    {
        const auto add = [](std::vector<J>& list, const Json::Value& jValue) {
            list.push_back(JsonLibrary<J>::fromText(toText(jValue)));
        };
        for (int id = 1; id <= rows; ++id) {
            Json::Value jRequest;
            Json::Value jChange;
            jRequest["id"] = id;
            jChange["name"] = newName(id);
            add(records_, bench::record(id));
            add(requests_, jRequest);
            add(changes_, jChange);
        }
        for (int group = 0; group < rows / kGroupSize; ++group) {
            Json::Value jRequest;
            jRequest["grp"] = groupName(group);
            add(groupRequests_, jRequest);
        }
    }

    Json::Value result() const override { return fromText(JsonLibrary<J>::toText(result_)); }
    void dropResult() override { result_ = J(); }

protected:
    J& record(int id) { return records_[index(id)]; }
    J& request(int id) { return requests_[index(id)]; }
    J& change(int id) { return changes_[index(id)]; }
    J& groupRequest(int group) { return groupRequests_[static_cast<std::size_t>(group)]; }

    J result_;

private:
    static std::size_t index(int id) { return static_cast<std::size_t>(id - 1); }

    std::vector<J> records_;
    std::vector<J> requests_;
    std::vector<J> changes_;
    std::vector<J> groupRequests_;
};

// One line of the list of contenders: a short name for commands, and the one for readers.
struct ContenderEntry {
    const char* szName;
    const char* szTitle;
    std::unique_ptr<Contender> (*make)();
};

// The library first, then the floor, then those of the others that were found at configure time.
const std::vector<ContenderEntry>& contenders();
// Ends the program for an unknown name.
std::unique_ptr<Contender> makeContender(const std::string& strName);

enum class Operation { kCreate, kFetch, kGroup, kList, kUpdate, kDelete };

struct OperationEntry {
    const char* szName;
    Operation operation;
};

const std::vector<OperationEntry>& operations();
Operation operationOf(const std::string& strName);

// How many calls the operation takes on a table of that many rows, and the call of that index.
int callCount(Operation operation, int rows);
void call(Contender& contender, Operation operation, int i);

// A contender on a table as the operation needs it: empty for the creation, filled otherwise.
std::unique_ptr<Contender> setUp(const std::string& strName, Operation operation, int rows);

}  // namespace bench
