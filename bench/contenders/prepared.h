// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// How a host uses a C++ library: its statements prepared once, as careful hosts do, or for each
// call, as the libraries' own examples do; a result's columns in the library's type for the rows of
// any table, or in a variable for each, bound by its position.
#pragma once

#include <functional>
#include <memory>
#include <utility>

namespace bench {

enum class Prepare { kOnce, kEachCall };
enum class Columns { kAsRow, kAsVariables };

template <typename StatementType>
class Prepared {
public:
    Prepared(Prepare when, std::function<StatementType()> make)
        : when_(when), make_(std::move(make))
    {
    }

    // Valid until the next call.
    StatementType& get()
    {
        if (Prepare::kEachCall == when_) statement_.reset();
        if (nullptr == statement_) statement_.reset(new StatementType(make_()));
        return *statement_;
    }

private:
    Prepare when_;
    std::function<StatementType()> make_;
    std::unique_ptr<StatementType> statement_;
};

}  // namespace bench
