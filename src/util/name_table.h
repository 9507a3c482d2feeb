// SPDX-FileCopyrightText: 2026 The vornjsondb authors
// SPDX-License-Identifier: MIT
// Values by name for all threads at once. What is in it stays, where it is, until the process ends.
#pragma once

#include <atomic>
#include <cstddef>
#include <functional>
#include <memory>
#include <string>
#include <string_view>
#include <utility>

namespace vorn {

// A trie over the bits of the names' hashes, so that a look-up takes as long among ten names as
// among a hundred thousand, and no name ever moves. No operation waits: an entry is complete before
// one exchange makes it visible, and of two threads that insert a name the first wins. Constant
// initialisation is enough for it, and nothing has to be destroyed.
template <typename Value>
class NameTable {
public:
    struct Entry {
        template <typename From>
        Entry(std::string_view strOf, std::size_t uOf, From&& from)
            : strName(strOf), uHash(uOf), value(std::forward<From>(from))
        {
        }

        const std::string strName;
        const std::size_t uHash;
        Value value;
        std::atomic<Entry*> pNext{nullptr};  // another name of the same hash
    };

    // Null if nobody has inserted the name.
    Entry* find(std::string_view strName) const
    {
        const std::size_t uHash = hash(strName);
        const Place* pPlace = &root_.at(uHash, 0);
        unsigned nBits = 0;
        while (const Node* pBelow = pPlace->pBelow.load(std::memory_order_acquire))
            pPlace = &pBelow->at(uHash, nBits += kBits);
        Entry* pEntry = pPlace->pEntry.load(std::memory_order_acquire);
        while (nullptr != pEntry && pEntry->strName != strName)
            pEntry = pEntry->pNext.load(std::memory_order_acquire);
        return pEntry;
    }

    // The entry that has the name from now on: a new one with a value that is made from the
    // argument, or that of another thread.
    template <typename From>
    Entry* insert(std::string_view strName, From&& from)
    {
        auto pNew = std::make_unique<Entry>(strName, hash(strName), std::forward<From>(from));
        Place* pPlace = &root_.at(pNew->uHash, 0);
        for (unsigned nBits = 0;;) {
            if (Node* pBelow = pPlace->pBelow.load(std::memory_order_acquire)) {
                pPlace = &pBelow->at(pNew->uHash, nBits += kBits);
                continue;
            }
            Entry* const pFirst = published(pPlace->pEntry, pNew.get());
            if (nullptr == pFirst) return pNew.release();
            if (pFirst->uHash == pNew->uHash) return appended(pFirst, std::move(pNew));
            // Both go one level down; where it was, the first one is not looked at any more.
            auto pBelow = std::make_unique<Node>();
            pBelow->at(pFirst->uHash, nBits + kBits).pEntry = pFirst;
            if (nullptr == published(pPlace->pBelow, pBelow.get())) (void)pBelow.release();
        }
    }

    // Calls visit(entry) for each, in no order.
    template <typename Visit>
    void forEach(Visit visit) const
    {
        visitAll(root_, visit);
    }

private:
    static constexpr unsigned kBits = 4;

    struct Node;
    struct Place {
        std::atomic<Entry*> pEntry{nullptr};
        std::atomic<Node*> pBelow{nullptr};
    };
    struct Node {
        Place& at(std::size_t uHash, unsigned nBits)
        {
            return places[uHash >> nBits & (kPlaces - 1)];
        }
        const Place& at(std::size_t uHash, unsigned nBits) const
        {
            return places[uHash >> nBits & (kPlaces - 1)];
        }

        static constexpr std::size_t kPlaces = 1U << kBits;
        Place places[kPlaces];
    };

    static std::size_t hash(std::string_view strName)
    {
        return std::hash<std::string_view>()(strName);
    }

    // Null, or what was there already and stays.
    template <typename Pointed>
    static Pointed* published(std::atomic<Pointed*>& pointer, Pointed* pNew)
    {
        Pointed* pThere = nullptr;
        pointer.compare_exchange_strong(pThere, pNew, std::memory_order_acq_rel);
        return pThere;
    }

    // At the end of the entries of one hash, unless one of them has the name.
    static Entry* appended(Entry* pEntry, std::unique_ptr<Entry> pNew)
    {
        for (;;) {
            if (pEntry->strName == pNew->strName) return pEntry;
            Entry* const pNext = published(pEntry->pNext, pNew.get());
            if (nullptr == pNext) return pNew.release();
            pEntry = pNext;
        }
    }

    template <typename Visit>
    static void visitAll(const Node& node, Visit& visit)
    {
        for (const Place& place : node.places) {
            if (const Node* pBelow = place.pBelow.load(std::memory_order_acquire)) {
                visitAll(*pBelow, visit);
                continue;
            }
            const Entry* pEntry = place.pEntry.load(std::memory_order_acquire);
            for (; nullptr != pEntry; pEntry = pEntry->pNext.load(std::memory_order_acquire))
                visit(*pEntry);
        }
    }

    Node root_;
};

}  // namespace vorn
