// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// The figures of a test program: what its loops reached, printed when it ends.
#pragma once

#include <iostream>
#include <map>
#include <string>

class Figures {
public:
    Figures() = default;
    Figures(const Figures&) = delete;
    Figures& operator=(const Figures&) = delete;
    ~Figures()
    {
        for (const auto& [strName, iNumber] : numbers_)
            std::cout << "figure: " << strName << " = " << iNumber << std::endl;
    }

    // The number of that name, 0 at first.
    static long long& of(const std::string& strName)
    {
        static Figures figures;
        return figures.numbers_[strName];
    }

private:
    std::map<std::string, long long> numbers_;
};
