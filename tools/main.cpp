// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// vornjsondb: works with the JSON records in the tables of an SQLite database.
#include "arguments.h"
#include "commands.h"
#include "failure.h"
#include "output.h"

#include <VornJsonDbApi.h>

#include <syslog.h>

#include <csignal>
#include <cstdio>
#include <new>

// The library's log: with -v on standard output, which is standard error by then.
bool blLogToStdout = false;
bool blDebugOutput = false;

namespace {

using namespace tool;

struct Command {
    const char* szName;
    const char* szArguments;
    std::size_t nLeast;
    std::size_t nMost;
    const char* szOptions;  // each between blanks
    int (*run)(const Arguments& arguments, Output& output);
    const char* szHelp;
};

constexpr Command kCommands[] = {
    {"import", "DATABASE TABLE [FILE] [--array NAME] [--batch N]", 2, 3, " array batch ", import,
     "insert all records of a file or none, or keep every N of them"},
    {"export",
     "DATABASE TABLE [CONDITION] [--csv] [--sort [-]MEMBER,...] [--limit N] [--offset N] "
     "[--after RECORD]",
     2, 3, " csv sort limit offset after ", exportRecords,
     "print the records as JSON lines or CSV"},
    {"list",
     "DATABASE TABLE [CONDITION] [--sort [-]MEMBER,...] [--limit N] [--offset N] [--after RECORD]",
     2, 3, " sort limit offset after ", list, "print the records, one per line"},
    {"get", "DATABASE TABLE CONDITION", 3, 3, " ", get, "print the first record"},
    {"count", "DATABASE TABLE [CONDITION]", 2, 3, " ", count, "print the number of records"},
    {"create", "DATABASE TABLE RECORD", 3, 3, " ", create, "insert a record"},
    {"save", "DATABASE TABLE RECORD", 3, 3, " ", save, "update or insert a record by its key"},
    {"update", "DATABASE TABLE CONDITION|--all VALUES", 3, 4, " all ", update,
     "set members of records"},
    {"delete", "DATABASE TABLE CONDITION|--all", 2, 3, " all ", tool::remove, "delete records"},
    {"check", "DATABASE [TABLE]", 1, 2, " ", check, "print which values are not read as they are"},
    {"describe", "DATABASE TABLE", 2, 2, " ", describe,
     "print the definition of a table that exists"},
    {"infer", "FILE [--table NAME] [--key MEMBER | --add-key NAME] [--array NAME]", 1, 1,
     " table key add-key array ", infer,
     "print a definition and a CREATE statement for the records of a file"},
};

std::string help()
{
    std::string strHelp = "usage: vornjsondb [-v] COMMAND ARGUMENT...\n\ncommands:\n";
    for (const Command& command : kCommands)
        strHelp += std::string("  ") + command.szName + " " + command.szArguments + "\n      " +
                   command.szHelp + "\n";
    return strHelp + R"(
TABLE is the name of a table in the database, or a JSON file with "name", "create" and "definition",
as describe and infer print them. FILE holds JSON lines or a JSON array; - is standard input.

options:
  -v, --verbose  show the library's log on standard error
  -h, --help     show this help
  -V, --version  show the version

The exit status is 0, 1 if something failed, 2 for wrong usage, 3 if get found nothing.
)";
}

const Command& findCommand(const Arguments& arguments)
{
    if (arguments.strCommand.empty()) throw UsageError("no command");
    for (const Command& command : kCommands) {
        if (command.szName != arguments.strCommand) continue;
        for (const auto& item : arguments.options)
            if (std::string::npos == std::string(command.szOptions).find(" " + item.first + " "))
                throw UsageError("no option of this command: --" + item.first);
        const std::size_t nValues = arguments.values.size();
        if (command.nLeast > nValues || command.nMost < nValues)
            throw UsageError(std::string("expected ") + command.szArguments);
        return command;
    }
    throw UsageError("no such command");
}

int runCommand(const Arguments& arguments, Output& output)
{
    if (arguments.blHelp) {
        output.text(help());
        return kDone;
    }
    if (arguments.blVersion) {
        output.text("vornjsondb " VORNJSONDB_VERSION "\n");
        return kDone;
    }
    return findCommand(arguments).run(arguments, output);
}

int report(const std::string& strCommand, const char* szWhat)
{
    (void)std::fprintf(stderr, "vornjsondb: %s%s%s\n", strCommand.c_str(),
                       strCommand.empty() ? "" : ": ", szWhat);
    return kFailed;
}

}  // namespace

int main(int argc, char** argv)
{
    (void)std::signal(SIGPIPE, SIG_IGN);
    // There is one thread, and nobody asks how much memory is in use.
    sqlite3_config(SQLITE_CONFIG_SINGLETHREAD);
    sqlite3_config(SQLITE_CONFIG_MEMSTATUS, 0);
    Output output;
    Arguments arguments;
    try {
        arguments = parseArguments(argc, argv);
        blLogToStdout = arguments.blVerbose;
        blDebugOutput = arguments.blVerbose;
        // Failures are reported with their reasons; the log would add the records themselves.
        if (!arguments.blVerbose) setlogmask(LOG_MASK(LOG_EMERG));
        const int iStatus = runCommand(arguments, output);
        output.finish();
        return iStatus;
    } catch (const UsageError& error) {
        report(arguments.strCommand, error.what());
        (void)std::fputs("Try 'vornjsondb --help'.\n", stderr);
        return kUsage;
    } catch (const ClosedPipe&) {
        return kFailed;
    } catch (const std::bad_alloc&) {
        return report(arguments.strCommand, "not enough memory");
    } catch (const std::exception& error) {
        return report(arguments.strCommand, error.what());
    }
}
