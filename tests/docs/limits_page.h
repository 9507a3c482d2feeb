// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// docs/limits.md: a test takes its examples from the section that names it.
#pragma once

#include "docs/section_test.h"

class Limits : public SectionTest {
protected:
    Limits() : SectionTest("limits.md") {}

    // The ids of the records that recList gives, like "123".
    std::string ids(const std::string& strRequest = "null")
    {
        const std::string strRecords = listed(api_, strRequest);
        if ("-1" == strRecords) return strRecords;
        std::string strIds;
        for (const std::string& strId : matches(strRecords, "\"id\":([0-9]+)")) strIds += strId;
        return strIds;
    }

    std::string stored(int iId) { return found(api_, R"({"id":)" + std::to_string(iId) + "}"); }

    // The table that the page begins with, in a file, so that a second connection can be opened.
    Database database_{Database::Place::kFile};
    const std::string strMembers_ = pageOf("limits.md").blocks.at(0).strText;
    Table table_{database_, strMembers_, pageOf("limits.md").blocks.at(1).strText};
    VornJsonDbApi& api_ = table_.api;
};
