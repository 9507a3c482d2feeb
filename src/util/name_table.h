// SPDX-License-Identifier: MIT
// Values by name for all threads at once. What is in it stays, where it is, until the process ends.
#pragma once

#include <atomic>
#include <cstddef>
#include <cstdint>
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
        Entry(std::string_view strOf, std::size_t uOf, Value&& of)
            : strName(strOf), uHash(uOf), value(std::move(of))
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
        const Node* pNode = &root_;
        for (unsigned nBits = 0;; nBits += kBits) {
            const std::uintptr_t uSlot = pNode->slot(uHash, nBits).load(std::memory_order_acquire);
            if (!isNode(uSlot)) return named(entryOf(uSlot), strName);
            pNode = nodeOf(uSlot);
        }
    }

    // The entry that has the name from now on: a new one with the value, or that of another thread.
    Entry* insert(std::string_view strName, Value value)
    {
        auto pNew = std::make_unique<Entry>(strName, hash(strName), std::move(value));
        Node* pNode = &root_;
        for (unsigned nBits = 0;;) {
            std::atomic<std::uintptr_t>& slot = pNode->slot(pNew->uHash, nBits);
            std::uintptr_t uSlot = slot.load(std::memory_order_acquire);
            if (isNode(uSlot)) {
                pNode = nodeOf(uSlot);
                nBits += kBits;
            } else if (0 == uSlot) {
                if (published(slot, uSlot, pNew.get())) return pNew.release();
            } else if (entryOf(uSlot)->uHash == pNew->uHash) {
                return appended(entryOf(uSlot), std::move(pNew));
            } else {
                // Both go one level down.
                auto pBelow = std::make_unique<Node>();
                pBelow->slot(entryOf(uSlot)->uHash, nBits + kBits) = uSlot;
                if (published(slot, uSlot, pBelow.get(), kNodeTag)) (void)pBelow.release();
            }
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
    // Tells the address of a node from that of an entry.
    static constexpr std::uintptr_t kNodeTag = 1;

    struct Node {
        std::atomic<std::uintptr_t>& slot(std::size_t uHash, unsigned nBits)
        {
            return slots[uHash >> nBits & ((1U << kBits) - 1)];
        }
        const std::atomic<std::uintptr_t>& slot(std::size_t uHash, unsigned nBits) const
        {
            return const_cast<Node*>(this)->slot(uHash, nBits);
        }

        std::atomic<std::uintptr_t> slots[1U << kBits] = {};
    };

    static std::size_t hash(std::string_view strName)
    {
        return std::hash<std::string_view>()(strName);
    }
    static bool isNode(std::uintptr_t uSlot) { return 0 != (uSlot & kNodeTag); }
    static Node* nodeOf(std::uintptr_t uSlot) { return reinterpret_cast<Node*>(uSlot - kNodeTag); }
    static Entry* entryOf(std::uintptr_t uSlot) { return reinterpret_cast<Entry*>(uSlot); }

    template <typename Pointed>
    static bool published(std::atomic<std::uintptr_t>& slot, std::uintptr_t uSeen, Pointed* pNew,
                          std::uintptr_t uTag = 0)
    {
        return slot.compare_exchange_strong(uSeen, reinterpret_cast<std::uintptr_t>(pNew) + uTag,
                                            std::memory_order_acq_rel);
    }

    static Entry* named(Entry* pEntry, std::string_view strName)
    {
        while (nullptr != pEntry && pEntry->strName != strName)
            pEntry = pEntry->pNext.load(std::memory_order_acquire);
        return pEntry;
    }

    // At the end of the entries of one hash, unless one of them has the name.
    static Entry* appended(Entry* pEntry, std::unique_ptr<Entry> pNew)
    {
        for (;;) {
            if (pEntry->strName == pNew->strName) return pEntry;
            Entry* pNext = nullptr;
            if (pEntry->pNext.compare_exchange_strong(pNext, pNew.get(), std::memory_order_acq_rel))
                return pNew.release();
            pEntry = pNext;
        }
    }

    template <typename Visit>
    static void visitAll(const Node& node, Visit& visit)
    {
        for (const auto& slot : node.slots) {
            const std::uintptr_t uSlot = slot.load(std::memory_order_acquire);
            if (isNode(uSlot)) {
                visitAll(*nodeOf(uSlot), visit);
                continue;
            }
            const Entry* pEntry = entryOf(uSlot);
            for (; nullptr != pEntry; pEntry = pEntry->pNext.load(std::memory_order_acquire))
                visit(*pEntry);
        }
    }

    Node root_;
};

}  // namespace vorn
