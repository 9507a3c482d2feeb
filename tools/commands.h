// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// The commands, one topic a file. Each returns the exit status, or throws what failure.h declares.
#pragma once

#include "arguments.h"
#include "output.h"

#include <json/value.h>

#include <string>

namespace tool {

int check(const Arguments& arguments, Output& output);
int count(const Arguments& arguments, Output& output);
int create(const Arguments& arguments, Output& output);
int describe(const Arguments& arguments, Output& output);
int exportRecords(const Arguments& arguments, Output& output);
int get(const Arguments& arguments, Output& output);
int import(const Arguments& arguments, Output& output);
int infer(const Arguments& arguments, Output& output);
int list(const Arguments& arguments, Output& output);
int remove(const Arguments& arguments, Output& output);
int save(const Arguments& arguments, Output& output);
int update(const Arguments& arguments, Output& output);

// The JSON of an argument; "-" stands for standard input.
Json::Value parseArgument(const std::string& strArgument, const char* szName);

}  // namespace tool
