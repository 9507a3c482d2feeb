// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
#include "support/child.h"

#include <fcntl.h>
#include <sys/prctl.h>
#include <sys/wait.h>
#include <unistd.h>
#include <cerrno>
#include <csignal>
#include <cstdio>
#include <cstdlib>
#include <utility>

namespace {

// dup2 of equal numbers would keep O_CLOEXEC.
bool give(int iFile, int iNumber)
{
    return iNumber == iFile ? 0 <= fcntl(iFile, F_SETFD, 0) : 0 <= dup2(iFile, iNumber);
}

}  // namespace

Child::Child(const std::vector<std::string>& command, int iReport)
{
    std::vector<char*> arguments;
    arguments.reserve(command.size() + 1);
    for (const std::string& strWord : command)
        arguments.push_back(const_cast<char*>(strWord.c_str()));
    arguments.push_back(nullptr);
    int input[2];
    int output[2];
    if (0 != pipe2(input, O_CLOEXEC) || 0 != pipe2(output, O_CLOEXEC)) abort();
    pid_ = fork();
    if (0 > pid_) abort();
    if (0 == pid_) {
        prctl(PR_SET_PDEATHSIG, SIGKILL);
        // iReport may equal the number of the input's end.
        if (!give(input[0], STDIN_FILENO) || !give(output[1], iReport)) _exit(5);
        execv(arguments[0], arguments.data());
        _exit(6);
    }
    close(input[0]);
    close(output[1]);
    iToChild_ = input[1];
    iFromChild_ = output[0];
}

Child::~Child()
{
    if (0 != pid_) kill();
    close(iToChild_);
    close(iFromChild_);
}

std::string Child::line()
{
    for (;;) {
        const std::size_t nEnd = strBuffer_.find('\n');
        if (std::string::npos != nEnd) {
            std::string strLine = strBuffer_.substr(0, nEnd);
            strBuffer_.erase(0, nEnd + 1);
            return strLine;
        }
        char bytes[4096];
        const ssize_t nRead = read(iFromChild_, bytes, sizeof bytes);
        if (0 > nRead && EINTR == errno) continue;
        if (0 >= nRead) return std::string();
        strBuffer_.append(bytes, static_cast<std::size_t>(nRead));
    }
}

bool Child::write(const std::string& strText) const
{
    return static_cast<ssize_t>(strText.size()) ==
           ::write(iToChild_, strText.data(), strText.size());
}

int Child::finish()
{
    close(std::exchange(iToChild_, -1));
    return wait();
}

bool Child::kill()
{
    ::kill(pid_, SIGKILL);
    const int iStatus = wait();
    if (WIFSIGNALED(iStatus) && SIGKILL == WTERMSIG(iStatus)) return true;
    printf("the process ended by itself, status %#x\n", static_cast<unsigned>(iStatus));
    return false;
}

int Child::wait()
{
    int iStatus = 0;
    while (pid_ != waitpid(pid_, &iStatus, 0))
        if (EINTR != errno) abort();
    pid_ = 0;
    return iStatus;
}
