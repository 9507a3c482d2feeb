// SPDX-License-Identifier: MIT
// A child process that reports in lines and is killed.
#pragma once

#include <sys/types.h>

#include <string>
#include <vector>

class Victim {
public:
    explicit Victim(const std::vector<std::string>& command);
    ~Victim();
    Victim(const Victim&) = delete;
    Victim& operator=(const Victim&) = delete;

    // The next whole line; false when the process has ended and all were read.
    bool line(std::string& strLine);
    // Sends SIGKILL; false when the process had ended by itself. Its lines can still be read.
    bool kill();

private:
    pid_t pid_ = 0;
    int iPipe_ = -1;
    std::string strBuffer_;
};
