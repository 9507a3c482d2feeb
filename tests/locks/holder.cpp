// SPDX-License-Identifier: MIT
#include "locks/holder.h"

#include <gtest/gtest.h>

#include <fcntl.h>
#include <spawn.h>
#include <sys/wait.h>
#include <unistd.h>
#include <cerrno>

Holder::Holder(const std::string& strFile, const std::string& strSql)
{
    int input[2];
    int output[2];
    if (0 != pipe2(input, O_CLOEXEC) || 0 != pipe2(output, O_CLOEXEC)) {
        ADD_FAILURE() << "no pipes";
        return;
    }
    posix_spawn_file_actions_t actions;
    posix_spawn_file_actions_init(&actions);
    posix_spawn_file_actions_adddup2(&actions, input[0], STDIN_FILENO);
    posix_spawn_file_actions_adddup2(&actions, output[1], STDOUT_FILENO);
    std::string strProgram = VORN_LOCK_HOLDER;
    std::string strFileCopy = strFile;
    std::string strSqlCopy = strSql;
    char* arguments[] = {strProgram.data(), strFileCopy.data(), strSqlCopy.data(), nullptr};
    EXPECT_EQ(0, posix_spawn(&pid_, VORN_LOCK_HOLDER, &actions, nullptr, arguments, environ));
    posix_spawn_file_actions_destroy(&actions);
    close(input[0]);
    close(output[1]);
    iToHolder_ = input[1];
    iFromHolder_ = output[0];
    expectAnswer('h');
}

Holder::~Holder()
{
    close(iToHolder_);
    int iStatus = -1;
    while (0 > waitpid(pid_, &iStatus, 0) && EINTR == errno) {
    }
    EXPECT_EQ(0, iStatus) << "the holder failed";
    close(iFromHolder_);
}

void Holder::release()
{
    EXPECT_EQ(1, write(iToHolder_, "x", 1));
    expectAnswer('r');
}

void Holder::expectAnswer(char cExpected) const
{
    char cAnswer = 0;
    ssize_t nRead = -1;
    do nRead = read(iFromHolder_, &cAnswer, 1);
    while (0 > nRead && EINTR == errno);
    EXPECT_EQ(cExpected, cAnswer) << "the holder said nothing";
}
