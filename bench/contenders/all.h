// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// Every contender; the optional ones are missing if their library was not found. "Kept" ones
// prepare their statements once, the others for each call.
#pragma once

#include "contender.h"

namespace bench {

std::unique_ptr<Contender> makeLibrary();
std::unique_ptr<Contender> makeFloor();
std::unique_ptr<Contender> makeCApi();
std::unique_ptr<Contender> makeNlohmann();
std::unique_ptr<Contender> makeSqliteCpp();
std::unique_ptr<Contender> makeSqliteCppExec();
std::unique_ptr<Contender> makeSqliteCppKept();
std::unique_ptr<Contender> makeSoci();
std::unique_ptr<Contender> makeSociVariables();
std::unique_ptr<Contender> makeSociKept();
std::unique_ptr<Contender> makePoco();
std::unique_ptr<Contender> makePocoVariables();
std::unique_ptr<Contender> makePocoKept();
std::unique_ptr<Contender> makeSqlJson();

}  // namespace bench
