#pragma once

#include "sgcore/containers/sgcontainerwarning.h"

#include <algorithm>
#include <functional>
#include <vector>

// An array kept in ascending order of `Less`: a checked wrapper around a sorted std::vector.
// Equal values keep their insertion order. Elements are read-only in place, so the order holds.
template <typename T, typename Less = std::less<T>> class SgTSortedArray {
public:
    SgTSortedArray() = default;

    // Number of elements. O(1).
    int count() const { return static_cast<int>(m_items.size()); }
    bool isEmpty() const { return m_items.empty(); }

    // The element at `index` in sorted order. An index outside [0, count()) is reported with
    // "Index out of range in SgTSortedArray::operator[]" and yields a default-valued scratch
    // element. O(1).
    const T &operator[](int index) const {
        if (index < 0 || index >= count()) {
            SG_CONTAINER_WARNING(
                QStringLiteral("Index out of range in SgTSortedArray::operator[]"));
            m_scratch = T();
            return m_scratch;
        }
        return m_items[static_cast<size_t>(index)];
    }

    // Inserts `value` after any equal elements and returns its index. O(count()).
    int add(const T &value) {
        const auto it = std::upper_bound(m_items.begin(), m_items.end(), value, Less());
        return static_cast<int>(m_items.insert(it, value) - m_items.begin());
    }

    // Index of the first element equal to `value` (neither is less than the other), or -1.
    // O(log count()).
    int find(const T &value) const {
        const auto it = std::lower_bound(m_items.begin(), m_items.end(), value, Less());
        if (it == m_items.end() || Less()(value, *it))
            return -1;
        return static_cast<int>(it - m_items.begin());
    }
    bool contains(const T &value) const { return find(value) >= 0; }

    // Removes `removeCount` elements from `start`; returns false and removes nothing when the
    // range does not lie within the array.
    bool removeByIndex(int start, int removeCount = 1) {
        if (start < 0 || removeCount < 0 || removeCount > count() - start)
            return false;
        const auto first = m_items.begin() + start;
        m_items.erase(first, first + removeCount);
        return true;
    }

    // Removes the first element equal to `value`; returns whether one was found.
    bool remove(const T &value) {
        const int index = find(value);
        return index >= 0 && removeByIndex(index, 1);
    }

    void clear() { m_items.clear(); }

    auto begin() const { return m_items.cbegin(); }
    auto end() const { return m_items.cend(); }

private:
    std::vector<T> m_items;
    mutable T m_scratch{};
};
