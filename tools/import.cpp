// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// Many records in one transaction, or in one for each batch.
#include "commands.h"
#include "database.h"
#include "failure.h"
#include "progress.h"
#include "record_reader.h"

#include <algorithm>
#include <cstdint>
#include <optional>

namespace tool {

namespace {

// What is handed to the table at once: as many records as stay in the processor's cache.
constexpr Json::ArrayIndex kMostRecords = 100;
constexpr std::size_t kMostBytes = 1048576;

class Import {
public:
    Import(const Table& table, long long nBatch)
        : table_(table), nBatch_(nBatch), transaction_(std::in_place, table.database.get(), kBegin)
    {
    }

    void add(Json::Value& jRecord, const Place& place, std::size_t nBytes)
    {
        jRecords_.append(std::move(jRecord));
        places_.push_back(place);
        nBytes_ += nBytes;
        const bool blBatch = nBatch_ == nStored_ - nKept_ + jRecords_.size();
        if (blBatch || kMostRecords == jRecords_.size() || kMostBytes <= nBytes_) store();
        if (blBatch) keep();
    }

    // What was added and is not stored yet.
    void store()
    {
        if (jRecords_.empty()) return;
        if (0 > table_.pRecords->createMany(jRecords_)) fail();
        nStored_ += jRecords_.size();
        jRecords_.clear();
        places_.clear();
        nBytes_ = 0;
        progress_.show(static_cast<unsigned long long>(nStored_));
    }

    void commit()
    {
        transaction_->commit();
        nKept_ = nStored_;
    }

    long long kept() const { return nKept_; }

private:
    static constexpr char kBegin[] = "begin immediate";

    [[noreturn]] void fail() const
    {
        const long long iRecord = table_.pRecords->record();
        const std::string& strReason = table_.pRecords->reason();
        if (0 > iRecord) throw Failure(strReason);
        // Without the position, "record 7: ".
        throw Failure(toString(places_[static_cast<std::size_t>(iRecord)]) + ": " +
                      strReason.substr(strReason.find(' ', 7) + 1));
    }

    void keep()
    {
        commit();
        transaction_.reset();
        transaction_.emplace(table_.database.get(), kBegin);
    }

    const Table& table_;
    const long long nBatch_;
    std::optional<Transaction> transaction_;
    Progress progress_;
    Json::Value jRecords_{Json::arrayValue};
    std::vector<Place> places_;
    std::size_t nBytes_ = 0;
    long long nStored_ = 0;  // in the transaction or before
    long long nKept_ = 0;    // in the transactions before
};

}  // namespace

int import(const Arguments& arguments, Output& output)
{
    const long long nBatch = arguments.number("batch", 1, 0);
    RecordReader reader(arguments.value(2, "-"), arguments.option("array"));
    const Table table = openTable(arguments.values[0], arguments.values[1], Open::kCreating);
    Import records(table, nBatch);
    Json::Value jRecord;
    try {
        while (reader.next(jRecord)) records.add(jRecord, reader.place(), reader.size());
        records.store();
        records.commit();
    } catch (const Failure& failure) {
        if (0 == nBatch) throw;
        throw Failure(failure.what() + ("; the first " + std::to_string(records.kept()) +
                                        " records were imported before it"));
    }
    Json::Value jCount;
    jCount["imported"] = Json::Int64(records.kept());
    output.line(jCount);
    return kDone;
}

}  // namespace tool
