#pragma once

#include "sgcore/containers/sgcontainerwarning.h"

#include <cstddef>
#include <new>
#include <stdexcept>
#include <vector>

// A last-in, first-out stack whose storage grows in blocks of a fixed number of elements.
// Popping an empty stack and running out of memory are reported on the Qt warning channel.
template <typename T> class SgTStack {
public:
    // An empty stack that grows by `blockSize` elements at a time (at least 1).
    explicit SgTStack(int blockSize = 16) : m_blockSize(blockSize > 0 ? blockSize : 1) {}

    // Number of elements. O(1).
    int count() const { return static_cast<int>(m_items.size()); }
    bool isEmpty() const { return m_items.empty(); }

    // Pushes `value`; returns false (stack unchanged) when a new block cannot be allocated.
    // Amortised O(1).
    bool push(const T &value) {
        if (m_items.size() == m_items.capacity() && !addBlocks(1))
            return false;
        m_items.push_back(value);
        return true;
    }

    // Removes and returns the top element. An empty stack is reported with
    // "Empty stack in SgTStack::pop()" and yields a default-valued element. O(1).
    T pop() {
        if (m_items.empty()) {
            SG_CONTAINER_WARNING(QStringLiteral("Empty stack in SgTStack::pop()"));
            return T();
        }
        T value = std::move(m_items.back());
        m_items.pop_back();
        return value;
    }

    // The top element; an empty stack yields a default-valued element (no warning).
    T top() const { return m_items.empty() ? T() : m_items.back(); }

    // Reserves room for `blocks` more blocks beyond the current elements. When that much
    // memory cannot be had, reports "Out of memory in SgTStack::addBlocks" and returns false,
    // leaving the stack as it was.
    bool addBlocks(int blocks) {
        if (blocks <= 0)
            return true;
        const size_t extra = static_cast<size_t>(blocks) * static_cast<size_t>(m_blockSize);
        try {
            if (extra > m_items.max_size() - m_items.size())
                throw std::length_error("stack too large");
            m_items.reserve(m_items.size() + extra);
        } catch (const std::bad_alloc &) {
            SG_CONTAINER_WARNING(QStringLiteral("Out of memory in SgTStack::addBlocks"));
            return false;
        } catch (const std::length_error &) {
            SG_CONTAINER_WARNING(QStringLiteral("Out of memory in SgTStack::addBlocks"));
            return false;
        }
        return true;
    }

    void clear() { m_items.clear(); }

private:
    std::vector<T> m_items;
    int m_blockSize;
};
