// SPDX-License-Identifier: MIT
/// @file
/// A progress bar on standard error, where that is a terminal.
#ifndef EXAMPLES_PROGRESS_H
#define EXAMPLES_PROGRESS_H

#include <unistd.h>

#include <cstdio>
#include <string>

class Progress {
public:
    explicit Progress(unsigned uTotal) : uTotal_(uTotal), blShown_(0 < uTotal && 1 == isatty(2)) {}
    ~Progress()
    {
        if (blShown_) std::fputc('\n', stderr);
    }
    Progress(const Progress&) = delete;
    Progress& operator=(const Progress&) = delete;

    // One step of the total is done.
    void advance()
    {
        ++uDone_;
        const int iPercent = static_cast<int>(100ULL * uDone_ / uTotal_);
        if (!blShown_ || iPercent == iPercent_) return;
        iPercent_ = iPercent;
        const std::string strBar(static_cast<std::size_t>(iPercent / 2), '#');
        std::fprintf(stderr, "\r[%-50s] %3d %% of %u", strBar.c_str(), iPercent, uTotal_);
        std::fflush(stderr);
    }

private:
    unsigned uTotal_;
    unsigned uDone_ = 0;
    bool blShown_;
    int iPercent_ = -1;
};

#endif
