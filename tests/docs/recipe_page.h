// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// A page of recipes: its tests run them in a folder of their own.
#pragma once

#include "docs/section_test.h"

#include <unistd.h>
#include <filesystem>

class RecipePage : public SectionTest {
protected:
    explicit RecipePage(const std::string& strFile) : SectionTest(strFile)
    {
        std::filesystem::remove_all(folder_);  // of a killed process that had the same id
        std::filesystem::create_directory(folder_);
    }
    ~RecipePage() override
    {
        EXPECT_EQ(Lines(), takeLog());
        std::filesystem::remove_all(folder_);
    }

    // Of a file in the folder.
    std::string path(const std::string& strName) const { return folder_ / strName; }

private:
    const std::filesystem::path folder_ = std::filesystem::temp_directory_path() /
                                          ("vornjsondb-" + std::to_string(getpid()) + "-recipe");
};
