// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
#include "output.h"

#include "failure.h"
#include "json_text.h"

#include <fcntl.h>
#include <poll.h>
#include <unistd.h>

#include <cerrno>
#include <cstdio>
#include <cstring>

namespace tool {

namespace {

constexpr std::size_t kBuffer = 65536;

[[noreturn]] void failWriting()
{
    if (EPIPE == errno) throw ClosedPipe();
    throw Failure(std::string("standard output: ") + std::strerror(errno));
}

}  // namespace

Output::Output() : iFile_(dup(STDOUT_FILENO))
{
    (void)std::setvbuf(stdout, nullptr, _IOLBF, 0);
    if (0 <= dup2(STDERR_FILENO, STDOUT_FILENO)) return;
    // Standard error is closed, and the log is for nobody.
    const int iNull = open("/dev/null", O_WRONLY);
    dup2(iNull, STDOUT_FILENO);
}

Output::~Output()
{
    if (0 <= iFile_) close(iFile_);
}

void Output::text(std::string_view strText)
{
    strBuffer_ += strText;
    if (kBuffer < strBuffer_.size()) write();
}

void Output::line(const Json::Value& jValue)
{
    appendJson(jValue, strBuffer_);
    text("\n");
}

void Output::finish()
{
    write();
    if (0 <= iFile_ && 0 != close(iFile_)) failWriting();
    iFile_ = -1;
}

void Output::write()
{
    std::string_view strLeft = strBuffer_;
    while (!strLeft.empty()) {
        const ssize_t nWritten = ::write(iFile_, strLeft.data(), strLeft.size());
        if (0 <= nWritten) {
            strLeft.remove_prefix(static_cast<std::size_t>(nWritten));
        } else if (EAGAIN == errno) {
            pollfd waiting{iFile_, POLLOUT, 0};
            poll(&waiting, 1, -1);
        } else if (EINTR != errno) {
            failWriting();
        }
    }
    strBuffer_.clear();
}

}  // namespace tool
