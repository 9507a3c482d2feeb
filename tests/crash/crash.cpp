// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// Kills writers at random moments and checks after each kill what is left in their database.
//
//     crash KILLS [FOLDER]
//
// FOLDER keeps the count, and an interrupted run is continued from there, on a new database.
// VORN_CRASH_SEED repeats what the writers do and the moments at which they are killed, as far as a
// machine can; the seed of a run is printed. The program starts itself as its own writers:
//
//     crash --write DATABASE JOURNAL_MODE SEED LAST_REVISION    writes until it is killed
//     crash --write DATABASE JOURNAL_MODE                       opens the database and lists it

#include "crash/model.h"
#include "support/child.h"
#include "support/connection.h"

#include <unistd.h>
#include <chrono>
#include <cmath>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <iostream>

namespace {

namespace fs = std::filesystem;
using Figures = std::map<std::string, long long>;

// The file descriptor of a writer's reports.
constexpr int kReport = 3;
constexpr unsigned kMostAcknowledged = 12;
constexpr double kLongestMicroseconds = 10000;
constexpr const char* kFiles[] = {"", "-journal", "-wal", "-shm"};
constexpr const char* kNames[] = {"kills",
                                  "kills while the next one opens",
                                  "acknowledged operations",
                                  "killed between operations",
                                  "killed in an operation, absent",
                                  "killed in an operation, whole",
                                  "hot journals left",
                                  "lost or wrong",
                                  "corrupt",
                                  "writers that failed"};

Figures load(const fs::path& file)
{
    Figures figures;
    std::ifstream in(file);
    std::string strName;
    for (long long iValue; std::getline(in, strName, '=') && in >> iValue >> std::ws;)
        figures[strName] = iValue;
    return figures;
}

void save(const Figures& figures, const fs::path& file)
{
    const fs::path part = file.string() + ".part";
    std::ofstream out(part);
    for (const auto& [strName, iValue] : figures) out << strName << '=' << iValue << '\n';
    out.close();
    fs::rename(part, file);
}

using Clock = std::chrono::steady_clock;
using Span = std::chrono::duration<double, std::micro>;

// Either somewhere within the time that an operation takes, or from one microsecond to ten
// milliseconds, short waits as likely as long ones. A busy wait, because a sleep is less exact.
void passSomeTime(Span operation, std::mt19937& random)
{
    const bool blWithin = 0 == random() % 2;
    const double dPart = std::uniform_real_distribution<double>(0, 1)(random);
    const Span span = blWithin ? operation * dPart : Span(std::pow(kLongestMicroseconds, dPart));
    const auto begin = Clock::now();
    while (Clock::now() - begin < span) {
    }
}

constexpr char kSelf[] = "/proc/self/exe";

void report(const std::string& strLine)
{
    if (static_cast<ssize_t>(strLine.size()) != write(kReport, strLine.data(), strLine.size()))
        std::exit(4);
}

// A host that writes until it is killed. It tells its parent when it begins an operation of the
// plan and when that is done, and ends by itself only when something fails.
int beWriter(const std::vector<std::string>& arguments)
{
    report("open\n");
    Store store(arguments.at(0));
    // A small cache, so that pages reach the database and its log before a transaction ends.
    const std::string& strMode = arguments.at(1);
    const std::string strSql =
        "pragma journal_mode=" + strMode + "; pragma cache_size=8; pragma wal_autocheckpoint=20";
    if (strMode + "20" != sqlite::value(store.pDb, strSql)) return 2;
    State state;
    Json::Value jRecords;
    if (!store.list(jRecords)) return 2;
    for (const Json::Value& jRecord : jRecords)
        state[jRecord["id"].asInt()] = jRecord["rev"].asInt();
    if (2 == arguments.size())
        for (;;) pause();

    std::mt19937 random(static_cast<unsigned>(std::stoul(arguments.at(2))));
    int iRevision = std::stoi(arguments.at(3));
    for (;;) {
        const Operation operation = plan(state, random, iRevision);
        report("begin\n");
        if (!perform(store, operation)) return 3;
        report("done\n");
        state = after(state, operation);
    }
}

class Run {
public:
    Run(fs::path folder, Figures& figures) : folder_(std::move(folder)), figures_(figures)
    {
        for (const char* szEnd : kFiles) fs::remove(database() + szEnd);
    }

    // One kill, or two. False if something is wrong.
    bool round(unsigned uSeed)
    {
        const long long iRound = figures_["kills"];
        std::seed_seq sequence{uSeed, static_cast<unsigned>(iRound)};
        std::mt19937 random(sequence);
        const std::string strMode = 0 == iRound % 2 ? "delete" : "wal";
        const bool blKilled = killWriter(strMode, random);
        if (hotJournal()) ++figures_["hot journals left"];
        if (!blKilled || (0 == random() % 3 && !killOpening(strMode, random))) {
            ++figures_["writers that failed"];
            return false;
        }
        return judge();
    }

    // Moves it out of the way of a later run.
    std::string keepDatabase()
    {
        std::string strKept = folder_ / ("fault-" + std::to_string(figures_["kills"]) + ".db");
        for (const char* szEnd : kFiles)
            if (fs::exists(database() + szEnd)) fs::rename(database() + szEnd, strKept + szEnd);
        return strKept;
    }

private:
    std::string database() const { return folder_ / "crash.db"; }

    // Some time after a number of acknowledgements, mostly timed from the start of the next
    // operation.
    bool killWriter(const std::string& strMode, std::mt19937& random)
    {
        const auto uSeed = static_cast<unsigned>(random());
        Child writer({kSelf, "--write", database(), strMode, std::to_string(uSeed),
                      std::to_string(iRevision_)},
                     kReport);
        plans_.seed(uSeed);
        long long& iAcknowledged = figures_["acknowledged operations"];
        const long long iBefore = iAcknowledged;
        const long long iUntil = iBefore + static_cast<int>(random() % (kMostAcknowledged + 1));
        bool blGood = true;
        const bool blWithin = 0 != random() % 4;
        const auto begin = Clock::now();
        do {
            blGood = take(writer.line());
        } while (blGood && (iAcknowledged < iUntil || (blWithin && !expected_.pending)));
        if (iBefore < iUntil) operation_ = (Clock::now() - begin) / (iUntil - iBefore);
        passSomeTime(operation_, random);
        blGood = writer.kill() && blGood;
        for (std::string strLine; blGood && !(strLine = writer.line()).empty();)
            blGood = take(strLine);
        ++figures_["kills"];
        return blGood;
    }

    // A report of the writer. False when it is none, or out of place.
    bool take(const std::string& strLine)
    {
        if ("open" == strLine) return true;
        if ((expected_.pending ? "done" : "begin") != strLine) return false;
        if (!expected_.pending) {
            expected_.pending = plan(expected_.state, plans_, iRevision_);
            return true;
        }
        ++figures_["acknowledged operations"];
        acknowledge();
        return true;
    }

    void acknowledge()
    {
        expected_.state = after(expected_.state, *expected_.pending);
        expected_.pending.reset();
    }

    // Before, while or after it recovers what the killed writer left.
    bool killOpening(const std::string& strMode, std::mt19937& random)
    {
        Child opener({kSelf, "--write", database(), strMode}, kReport);
        const bool blGood = !opener.line().empty();
        passSomeTime(operation_, random);
        ++figures_["kills while the next one opens"];
        return opener.kill() && blGood;
    }

    // A rollback journal that has to be played back: its header is not wiped.
    bool hotJournal() const
    {
        std::ifstream journal(database() + "-journal", std::ios::binary);
        return 0 < journal.get();
    }

    bool judge()
    {
        const Verdict verdict = check(database(), expected_);
        if (!verdict.strWrong.empty()) ++figures_["lost or wrong"];
        if (!verdict.strCorrupt.empty()) ++figures_["corrupt"];
        for (const std::string& strFault : {verdict.strWrong, verdict.strCorrupt})
            if (!strFault.empty())
                std::cout << "kill " << figures_["kills"] << ": " << strFault << '\n';
        const char* const kEndings[] = {"killed between operations",
                                        "killed in an operation, absent",
                                        "killed in an operation, whole"};
        ++figures_[kEndings[verdict.pending]];
        if (Verdict::kWhole == verdict.pending) acknowledge();
        expected_.pending.reset();
        return verdict.strWrong.empty() && verdict.strCorrupt.empty();
    }

    fs::path folder_;
    Figures& figures_;
    Expected expected_;
    std::mt19937 plans_;  // of the present writer
    int iRevision_ = 0;   // the last one planned
    Span operation_{1000};
};

// The numbers of faults come last; a fault of an earlier part of the run counts too.
bool show(Figures& figures)
{
    for (const char* szName : kNames)
        std::cout << "figure: crash, " << szName << " = " << figures[szName] << '\n';
    return 0 == figures["lost or wrong"] + figures["corrupt"] + figures["writers that failed"];
}

}  // namespace

int main(int argc, char** argv)
{
    if (3 < argc && std::string("--write") == argv[1]) return beWriter({argv + 2, argv + argc});
    const long long iKills = 1 < argc ? std::strtoll(argv[1], nullptr, 10) : 0;
    if (1 > iKills) {
        std::cerr << "usage: crash KILLS [FOLDER]\n";
        return 2;
    }
    const bool blKept = 2 < argc;
    std::string strFolder = blKept ? argv[2] : "crash-XXXXXX";
    if (!blKept && nullptr == mkdtemp(strFolder.data())) std::abort();
    const fs::path folder = strFolder;
    fs::create_directories(folder);
    Figures figures = load(folder / "progress");
    const char* szSeed = std::getenv("VORN_CRASH_SEED");
    figures.emplace("seed",
                    nullptr == szSeed ? std::random_device()() : std::strtoul(szSeed, nullptr, 10));
    const auto uSeed = static_cast<unsigned>(figures["seed"]);
    std::cout << "VORN_CRASH_SEED=" << uSeed << ", from kill " << figures["kills"] << std::endl;

    bool blGood = true;
    for (Run run(folder, figures); blGood && figures["kills"] < iKills;) {
        blGood = run.round(uSeed);
        save(figures, folder / "progress");
        if (!blGood) std::cout << "see " << run.keepDatabase() << '\n';
    }
    const bool blSound = show(figures);
    if (!blKept && blSound) fs::remove_all(folder);
    return blSound ? 0 : 1;
}
