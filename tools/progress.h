// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// How far a long command is, on standard error, if that is a terminal.
#pragma once

#include <unistd.h>

#include <cstdio>

namespace tool {

class Progress {
public:
    Progress() : blShown_(1 == isatty(STDERR_FILENO)) {}
    ~Progress()
    {
        if (blShown_) (void)std::fputc('\n', stderr);
    }
    Progress(const Progress&) = delete;
    Progress& operator=(const Progress&) = delete;

    void show(unsigned long long nRecords) const
    {
        if (blShown_) (void)std::fprintf(stderr, "\r%llu records", nRecords);
    }

private:
    const bool blShown_;
};

}  // namespace tool
