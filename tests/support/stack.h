// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// Work on a stack of a known size.
#pragma once

#include <gtest/gtest.h>
#include <pthread.h>

#include <cstddef>
#include <functional>

// The frames of a sanitizer are larger.
#if defined(__SANITIZE_ADDRESS__) || defined(__SANITIZE_THREAD__)
#define VORN_SANITIZED 1
#else
#define VORN_SANITIZED 0
#endif

// Runs the work in a thread with that much stack.
inline void withStack(std::size_t nBytes, std::function<void()> work)
{
    pthread_attr_t attributes;
    ASSERT_EQ(0, pthread_attr_init(&attributes));
    ASSERT_EQ(0, pthread_attr_setstacksize(&attributes, nBytes));
    const auto run = [](void* pWork) -> void* {
        (*static_cast<std::function<void()>*>(pWork))();
        return nullptr;
    };
    pthread_t thread{};
    ASSERT_EQ(0, pthread_create(&thread, &attributes, run, &work));
    EXPECT_EQ(0, pthread_join(thread, nullptr));
    pthread_attr_destroy(&attributes);
}
