// SPDX-License-Identifier: MIT
#include "figures.h"

#include <cstdio>

namespace {

using allocators::Fault;
using allocators::Kind;

// Empty, or what is wrong with the point; kept is what an undisturbed call keeps.
std::string problemOf(const Point& point, const allocators::Blocks& kept)
{
    if ('\0' != *point.szProblem) return point.szProblem;
    if (point.kept.nNew != kept.nNew || point.kept.nMalloc != kept.nMalloc)
        return "leaked " + std::to_string(point.kept.nNew - kept.nNew) + " blocks of new, " +
               std::to_string(point.kept.nMalloc - kept.nMalloc) + " of malloc";
    return std::string();
}

}  // namespace

void Figures::add(const Point& point)
{
    ++iPoints;
    ++iEndings[static_cast<int>(point.ending)];
}

void Figures::print(const std::string& strName) const
{
    const auto line = [&](const char* szWhat, int iNumber) {
        printf("figure: %s, %s = %d\n", strName.c_str(), szWhat, iNumber);
    };
    const auto ended = [&](Ending ending) { return iEndings[static_cast<int>(ending)]; };
    line("points failed", iPoints);
    line("findings", iFindings);
    line("absorbed", ended(Ending::kAsUndisturbed));
    line("result -1", ended(Ending::kRefused));
    line("std::bad_alloc", ended(Ending::kBadAlloc));
    line("Json::RuntimeError", ended(Ending::kRuntimeError));
    line("std::logic_error", ended(Ending::kLogicError));
    fflush(stdout);
}

std::string failEach(const Case& row, Fault fault, AtPoint atPoint, Figures& figures)
{
    std::string strProblems;
    const auto report = [&](const std::string& strProblem) {
        ++figures.iFindings;
        strProblems += std::string(row.szName) + ", " + nameOf(fault) + ", allocation " +
                       std::to_string(fault.iNth) + ": " + strProblem + "\n";
    };

    // The first fills what lasts as long as the process.
    fault.iNth = 0;
    atPoint(row, fault);
    const Point undisturbed = atPoint(row, fault);
    if ('\0' != *undisturbed.szProblem) {
        report(undisturbed.szProblem);
        return strProblems;
    }
    for (fault.iNth = 1;; ++fault.iNth) {
        const Point point = atPoint(row, fault);
        const std::string strProblem = problemOf(point, undisturbed.kept);
        if (!strProblem.empty()) report(strProblem);
        if (!point.blFailed) return strProblems;
        figures.add(point);
    }
}

std::string nameOf(const Fault& fault)
{
    std::string strName = "memory faults, ";
    switch (fault.kind) {
    case Kind::kSqlite: strName += "SQLite"; break;
    case Kind::kNew: strName += "operator new"; break;
    case Kind::kMalloc: strName += "malloc"; break;
    case Kind::kEvery: strName += "every allocator"; break;
    }
    return strName + (fault.blFromThenOn ? ", from then on" : ", once");
}
