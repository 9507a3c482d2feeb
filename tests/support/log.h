// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// The log as a test reads it.
#pragma once

#include <set>
#include <string>
#include <vector>

using Lines = std::vector<std::string>;

template <typename Item>
std::vector<Item> operator+(std::vector<Item> items, const std::vector<Item>& more)
{
    items.insert(items.end(), more.begin(), more.end());
    return items;
}

// The lines since the last call (or reset), each brought to the form
//
//     E VornJsonDbApi: Failed [!pDb]        error family (the text without its ", err=...")
//     P util: strJsonName=task              plain family
//
// after everything else about it has been checked: the exact form of its variant, process id,
// component, priority, errno, and that the line number leads to the very check in the component's
// sources. A line that breaks a rule comes as "BROKEN ...". A number in "errno=2," has to be the
// errno of the line and comes as "errno=?,".
Lines takeLog();

// A failed check of the class, or of the free functions.
std::string failed(const std::string& strCondition);
std::string utilFailed(const std::string& strCondition);
// Another message of the error family of the class.
std::string error(const std::string& strMessage);
// A line of the plain family of the class.
std::string plain(const std::string& strMessage);
std::string utilPlain(const std::string& strMessage);

// The places of a text in the sources of a component, such as "util:12", one per line of code.
std::multiset<std::string> placesOf(const std::string& strComponent, const std::string& strText);
