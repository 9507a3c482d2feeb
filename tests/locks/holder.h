// SPDX-License-Identifier: MIT
// A second process that holds a lock on a database file.
#pragma once

#include <sys/types.h>
#include <string>

class Holder {
public:
    // Returns when the other process has run the text, which begins a transaction.
    Holder(const std::string& strFile, const std::string& strSql);
    // Waits for the end of the other process; the test fails when it failed.
    ~Holder();
    Holder(const Holder&) = delete;
    Holder& operator=(const Holder&) = delete;

    // Returns when the transaction is committed.
    void release();

private:
    void expectAnswer(char cExpected) const;

    pid_t pid_ = -1;
    int iToHolder_ = -1;
    int iFromHolder_ = -1;
};
