// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// What the library keeps for each thread.
#pragma once

#include <memory>

namespace vorn {

// A part of it; each kind has one user, who says what it holds.
class ThreadPart {
public:
    ThreadPart() = default;
    ThreadPart(const ThreadPart&) = delete;
    ThreadPart& operator=(const ThreadPart&) = delete;
    virtual ~ThreadPart() = default;

    enum Kind { kLastTypes, kReader, kRows, kCount };
};

// Where the calling thread keeps the part of that kind; empty before its first use. It is released
// when the thread ends, after the destructors of the thread's own variables. What asks even later
// (another key's destructor, or the process while it exits) gets an empty one again.
std::unique_ptr<ThreadPart>& threadPart(ThreadPart::Kind kind);

// The calling thread's T, made when it is first asked for.
template <typename T>
T& ofThisThread()
{
    std::unique_ptr<ThreadPart>& pPart = threadPart(T::kKind);
    if (nullptr == pPart) pPart = std::make_unique<T>();
    return static_cast<T&>(*pPart);
}

}  // namespace vorn
