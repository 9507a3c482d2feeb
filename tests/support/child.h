// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// Another process, which reports in lines.
#pragma once

#include <sys/types.h>

#include <string>
#include <vector>

class Child {
public:
    // The child gets a pipe from this process as standard input, and one back to it as iReport.
    Child(const std::vector<std::string>& command, int iReport);
    // Kills it unless it has ended.
    ~Child();
    Child(const Child&) = delete;
    Child& operator=(const Child&) = delete;

    // The next whole line; "" when the process has ended and all were read.
    std::string line();
    bool write(const std::string& strText) const;
    // Ends its input and returns its status.
    int finish();
    // Sends SIGKILL; false if the process had already ended. Its lines can still be read.
    bool kill();

private:
    int wait();

    pid_t pid_ = 0;
    int iToChild_ = -1;
    int iFromChild_ = -1;
    std::string strBuffer_;
};
