// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
#include "util/thread_state.h"

#include <pthread.h>
#include <atomic>
#include <new>

namespace vorn {

namespace {

struct ThreadState {
    std::unique_ptr<ThreadPart> parts[ThreadPart::kCount];
};

// A pointer is all that the library takes of the space for thread-local variables, which is scarce
// for libraries that are loaded late.
[[gnu::tls_model("initial-exec")]] thread_local ThreadState* pState = nullptr;

void release(void* pEnded)
{
    pState = nullptr;
    delete static_cast<ThreadState*>(pEnded);
}

// The key whose destructor releases a thread's state. Not a static variable of the function: a
// process that is forked while another thread makes that one would wait for it forever.
pthread_key_t key()
{
    // The key plus one, or 0.
    static std::atomic<unsigned> published{0};
    static_assert(std::atomic<unsigned>::is_always_lock_free);
    unsigned uThere = published.load(std::memory_order_acquire);
    if (0 != uThere) return uThere - 1;

    pthread_key_t made = 0;
    if (0 != pthread_key_create(&made, release)) throw std::bad_alloc();
    if (published.compare_exchange_strong(uThere, made + 1, std::memory_order_acq_rel)) return made;
    pthread_key_delete(made);
    return uThere - 1;
}

// Not inlined: it is called once a thread.
[[gnu::noinline]] ThreadState* newState()
{
    auto pNew = std::make_unique<ThreadState>();
    if (0 != pthread_setspecific(key(), pNew.get())) throw std::bad_alloc();
    return pState = pNew.release();
}

}  // namespace

std::unique_ptr<ThreadPart>& threadPart(ThreadPart::Kind kind)
{
    ThreadState* const pOfThread = nullptr == pState ? newState() : pState;
    return pOfThread->parts[kind];
}

}  // namespace vorn
