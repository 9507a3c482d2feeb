// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// When threads begin, end and fork, and how little stack they may have. No doubles here, which
// would see the library's own variables of a thread come and go.

#include "host/task.h"
#include "support/stack.h"

#include <VornJsonDbApi.h>
#include <gtest/gtest.h>

#include <dlfcn.h>
#include <pthread.h>
#include <sys/wait.h>
#include <syslog.h>
#include <unistd.h>
#include <atomic>
#include <cerrno>
#include <cstdlib>
#include <cstring>
#include <filesystem>
#include <fstream>
#include <memory>
#include <new>
#include <string>
#include <thread>
#include <utility>
#include <vector>

bool blLogToStdout = false;
bool blDebugOutput = false;

namespace {

const Json::Value& typesOf(std::string strName)
{
    Json::Value jDefinition;
    jDefinition[strName]["member"]["a"]["cpptype"] = "int";
    return VORN_JSON_DB::recType(jDefinition, strName);
}

// What happens when the library makes its key, or keeps a value under it.
enum class Trouble { kNone, kNoKey, kNoValue, kLate } trouble = Trouble::kNone;

void useAtTheEnd(void* pTask);

// The first call of the library in the process, after the host has made a key of its own.
struct FirstUse {
    FirstUse()
    {
        pthread_key_create(&before, useAtTheEnd);
        trouble = Trouble::kNoKey;
        try {
            typesOf("first");
        } catch (const std::bad_alloc&) {
            blRefused = true;
        }
        trouble = Trouble::kLate;
        typesOf("first");
    }
    pthread_key_t before = 0;
    bool blRefused = false;
};
const FirstUse firstUse;

// Decodes a row, which takes all that the library keeps for a thread, and logs a failure.
bool works(Task& task)
{
    return task.works(1) && -1 == task.api().runSqlEx("nonsense");
}

bool works()
{
    Task task;
    return works(task);
}

// A host's global handle: it works before main and after it.
struct GlobalTask : Task {
    GlobalTask() { api(); }
    ~GlobalTask()
    {
        if (!::works(*this)) _exit(3);
    }
};
GlobalTask globalTask;

long residentBytes()
{
    long lPages = 0;
    std::ifstream("/proc/self/statm") >> lPages >> lPages;
    return lPages * sysconf(_SC_PAGESIZE);
}

TEST(ThreadLifetimes, MayBeginWithALackOfMemory)
{
    if (VORN_SANITIZED) GTEST_SKIP() << "a sanitizer makes keys before anything can be replaced";
    EXPECT_TRUE(firstUse.blRefused);
    EXPECT_EQ(Trouble::kNone, trouble) << "another thread made the key first";
    std::thread([] {
        trouble = Trouble::kNoValue;
        EXPECT_THROW(typesOf("second"), std::bad_alloc);
        trouble = Trouble::kNone;
        EXPECT_EQ(1U, typesOf("second").size());
    }).join();
}

TEST(ThreadLifetimes, LeaveNothingBehind)
{
    const auto runThreads = [](int nThreads) {
        for (int i = 0; i < nThreads; ++i) std::thread([] { EXPECT_TRUE(works()); }).join();
    };
    constexpr int kThreads = VORN_SANITIZED ? 500 : 10000;
    constexpr int kFirst = 100;
    runThreads(kFirst);
    const long lBefore = residentBytes();
    runThreads(kThreads - kFirst);
    const long lGrowth = residentBytes() - lBefore;
    printf("figure: threads in sequence = %d\n", kThreads);
    printf("figure: their growth in KiB after the first %d = %ld\n", kFirst, lGrowth / 1024);
    // A sanitizer keeps what was freed, and finds leaks itself.
    EXPECT_TRUE(VORN_SANITIZED || 1 << 20 > lGrowth) << lGrowth;
}

void useAtTheEnd(void* pTask)
{
    const std::unique_ptr<Task> pOwned(static_cast<Task*>(pTask));
    if (!works(*pOwned)) abort();
}

// What the library kept for the thread may be released by then; it is made again.
TEST(ThreadLifetimes, AllowCallsUntilTheirVeryEnd)
{
    pthread_key_t after = 0;
    ASSERT_EQ(0, pthread_key_create(&after, useAtTheEnd));
    struct AtTheEnd {
        ~AtTheEnd() { EXPECT_TRUE(works()); }
    };
    std::thread([=] {
        static thread_local AtTheEnd atTheEnd;
        EXPECT_TRUE(works());
        EXPECT_EQ(0, pthread_setspecific(firstUse.before, new Task));
        EXPECT_EQ(0, pthread_setspecific(after, new Task));
        EXPECT_NE(nullptr, &atTheEnd);
    }).join();
    EXPECT_EQ(0, pthread_key_delete(after));
}

// Run by itself, by main below: what unwinds here must not meet the frames of a test.
[[noreturn]] void endMainFirst()
{
    works();
    std::thread([] {
        // ThreadSanitizer cannot join the main thread.
        const std::string strState = "/proc/self/task/" + std::to_string(getpid()) + "/stat";
        for (std::string strLine; std::string::npos == strLine.find(") Z");)
            std::getline(std::ifstream(strState), strLine);
        exit(works() && works(globalTask) ? 0 : 1);
    }).detach();
    pthread_exit(nullptr);
}

TEST(ThreadLifetimes, GoOnAfterMainHasEnded)
{
    const std::string strSelf = std::filesystem::read_symlink("/proc/self/exe");
    EXPECT_EQ(0, system((strSelf + " --end-main-first").c_str()));
}

// Only SQLite's own mutexes, which no other thread may hold then, keep a host from more.
TEST(ThreadLifetimes, MayForkWhileOthersPublish)
{
    if (VORN_SANITIZED) GTEST_SKIP() << "a sanitizer does not support forks beside threads";
    constexpr int kNamesAFork = 30;
    std::atomic<int> iForks{0};  // or -1 at the end
    std::atomic<int> iNames{0};
    constexpr int kForks = 1000;
    std::vector<const Json::Value*> published(kNamesAFork * (kForks + 1));
    const auto publish = [](int n) { return &typesOf("published" + std::to_string(n)); };
    std::vector<std::thread> publishers;
    for (int i = 0; i < 3; ++i)
        publishers.emplace_back([&] {
            while (0 <= iForks) {
                if (kNamesAFork * iForks <= iNames) {
                    std::this_thread::yield();
                    continue;
                }
                const int n = iNames++;
                published[static_cast<std::size_t>(n)] = publish(n);
            }
        });
    int nWorking = 0;
    for (int i = 0; i < kForks; ++i) {
        ++iForks;
        const pid_t child = fork();
        if (0 == child)
            _exit(1U == typesOf("forked" + std::to_string(i)).size() && works() ? 0 : 1);
        int iStatus = -1;
        EXPECT_EQ(child, waitpid(child, &iStatus, 0));
        nWorking += 0 == iStatus ? 1 : 0;
    }
    iForks = -1;
    for (std::thread& publisher : publishers) publisher.join();
    EXPECT_EQ(kForks, nWorking);
    for (int n = 0; n < iNames; ++n) EXPECT_EQ(publish(n), published[static_cast<std::size_t>(n)]);
    printf("figure: forks beside threads that publish = %d\n", kForks);
}

TEST(ThreadLifetimes, NeedAStackForNestedJson)
{
    withStack(VORN_SANITIZED ? 16 << 20 : 1 << 20, [] {
        Task task;
        Json::Value jRecord = Task::record(1);
        for (int i = 2; i < 1000; ++i) {
            Json::Value jOuter;
            jOuter["k"].swap(jRecord["data"]);
            jRecord["data"].swap(jOuter);
        }
        Json::Value jStored;
        EXPECT_EQ(0, task.api().recCreate(jRecord, jStored));
        EXPECT_TRUE(jRecord == jStored);
    });
}

}  // namespace

extern "C" {

#if !VORN_SANITIZED
int pthread_key_create(pthread_key_t* pKey, void (*destructor)(void*)) noexcept
{
    static const auto pReal =
        reinterpret_cast<decltype(&pthread_key_create)>(dlsym(RTLD_NEXT, "pthread_key_create"));
    if (Trouble::kNoKey == trouble) return EAGAIN;
    if (Trouble::kLate == std::exchange(trouble, Trouble::kNone))
        std::thread([] { typesOf("by another thread"); }).join();
    return pReal(pKey, destructor);
}

int pthread_setspecific(pthread_key_t key, const void* pValue) noexcept
{
    static const auto pReal =
        reinterpret_cast<decltype(&pthread_setspecific)>(dlsym(RTLD_NEXT, "pthread_setspecific"));
    return Trouble::kNoValue == trouble ? ENOMEM : pReal(key, pValue);
}
#endif

}  // extern "C"

int main(int argc, char** argv)
{
    if (2 == argc && 0 == strcmp("--end-main-first", argv[1])) endMainFirst();
    setlogmask(LOG_MASK(LOG_DEBUG));  // which drops the library's lines
    testing::InitGoogleTest(&argc, argv);
    return RUN_ALL_TESTS();
}
