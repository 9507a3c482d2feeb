// SPDX-License-Identifier: MIT
#include "crash/victim.h"

#include "crash/expected.h"

#include <fcntl.h>
#include <sys/prctl.h>
#include <sys/wait.h>
#include <unistd.h>
#include <csignal>
#include <cstdio>
#include <cstdlib>

Victim::Victim(const std::vector<std::string>& command)
{
    std::vector<char*> arguments;
    arguments.reserve(command.size() + 1);
    for (const std::string& strWord : command)
        arguments.push_back(const_cast<char*>(strWord.c_str()));
    arguments.push_back(nullptr);
    int ends[2];
    if (0 != pipe2(ends, O_CLOEXEC)) std::abort();
    pid_ = fork();
    if (0 > pid_) std::abort();
    if (0 == pid_) {
        prctl(PR_SET_PDEATHSIG, SIGKILL);
        // The parent's reading end may have this very number; dup2 of equal numbers keeps
        // O_CLOEXEC.
        if (kReport == ends[1] ? 0 > fcntl(kReport, F_SETFD, 0) : 0 > dup2(ends[1], kReport))
            _exit(5);
        execv(arguments[0], arguments.data());
        _exit(6);
    }
    close(ends[1]);
    iPipe_ = ends[0];
}

Victim::~Victim()
{
    if (0 != pid_) kill();
    close(iPipe_);
}

bool Victim::line(std::string& strLine)
{
    for (;;) {
        const std::size_t nEnd = strBuffer_.find('\n');
        if (std::string::npos != nEnd) {
            strLine = strBuffer_.substr(0, nEnd);
            strBuffer_.erase(0, nEnd + 1);
            return true;
        }
        char bytes[4096];
        const ssize_t nRead = read(iPipe_, bytes, sizeof bytes);
        if (0 >= nRead) return false;
        strBuffer_.append(bytes, static_cast<std::size_t>(nRead));
    }
}

bool Victim::kill()
{
    int iStatus = 0;
    ::kill(pid_, SIGKILL);
    if (pid_ != waitpid(pid_, &iStatus, 0)) std::abort();
    pid_ = 0;
    if (WIFSIGNALED(iStatus) && SIGKILL == WTERMSIG(iStatus)) return true;
    std::printf("the writer ended by itself, status %#x\n", static_cast<unsigned>(iStatus));
    return false;
}
