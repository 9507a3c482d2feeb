// SPDX-License-Identifier: MIT
// An object that is never destroyed.
#pragma once

#include <new>
#include <utility>

namespace vorn {

// For a static variable of a function: made when the function is first called, and usable until the
// process is gone, so that a host's global handle may work before main begins and after it has
// ended.
template <typename T>
class NoDestructor {
public:
    template <typename... Arguments>
    explicit NoDestructor(Arguments&&... arguments)
    {
        new (storage_) T(std::forward<Arguments>(arguments)...);
    }
    NoDestructor(const NoDestructor&) = delete;
    NoDestructor& operator=(const NoDestructor&) = delete;

    T& operator*() { return *std::launder(reinterpret_cast<T*>(storage_)); }

private:
    alignas(T) unsigned char storage_[sizeof(T)];
};

}  // namespace vorn
