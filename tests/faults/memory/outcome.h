// SPDX-License-Identifier: MIT
// A call of a case with its outcome as JSON, which has the members that cases.h describes.
#pragma once

#include "allocators.h"
#include "cases.h"
#include "store.h"

#include <string>

// Prepares the calls of one case on the host's connection.
class Attempt {
public:
    Attempt(const Case& row, Store& store);

    // Brings the arguments and the message back to what they are before the call, and runs the
    // host's SQL of the case.
    void prepare();
    // The call alone, with the fault armed; tells whether an allocation failed.
    bool call(const allocators::Fault& fault);
    // What there is now.
    Json::Value outcome();

    // Before the call, and after an undisturbed one.
    const Json::Value& before() const { return jBefore_; }
    const Json::Value& after() const { return jAfter_; }
    // Whether an output may be between them.
    bool grows() const;
    bool silent() const { return blSilent_; }
    const char* name() const { return row_.szName; }

    // How the call ended: "" where it returned, otherwise the exception that it threw.
    const std::string& thrown() const { return strThrown_; }

private:
    void setArguments(const Json::Value& jState);

    const Case& row_;
    Store& store_;
    Call call_;
    Json::Value jState_;
    Json::Value jBefore_;
    Json::Value jAfter_;
    std::string strGrows_;
    bool blSilent_ = false;
    int iResult_ = 0;
    std::string strThrown_;
};

// Empty, or what must not be after a call during which memory was lacking.
std::string whatIsWrong(const Attempt& attempt, const Json::Value& jOutcome);
