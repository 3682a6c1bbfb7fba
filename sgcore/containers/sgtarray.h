#pragma once

#include "sgcore/containers/sgcontainerwarning.h"

#include <algorithm>
#include <vector>

// A growable array of values in insertion order: a checked wrapper around std::vector.
// Storage grows in multiples of the growth step. Misuse (a bad index or removal range) is
// reported on the Qt warning channel and leaves the array unchanged.
template <typename T> class SgTArray {
public:
    // An empty array whose capacity grows by `growthStep` elements at a time (at least 1).
    explicit SgTArray(int growthStep = 8) : m_growthStep(std::max(1, growthStep)) {}

    // Number of elements. O(1).
    int count() const { return static_cast<int>(m_items.size()); }
    bool isEmpty() const { return m_items.empty(); }

    // The growth step; changing it affects later growth only.
    int growthStep() const { return m_growthStep; }
    void setGrowthStep(int growthStep) { m_growthStep = std::max(1, growthStep); }

    // The element at `index`. An index outside [0, count()) is reported with
    // "Index out of range in SgTArray::operator[]" and yields a reference to a default-valued
    // scratch element that belongs to no position (writes to it are lost). O(1).
    T &operator[](int index) {
        if (index < 0 || index >= count()) {
            SG_CONTAINER_WARNING(QStringLiteral("Index out of range in SgTArray::operator[]"));
            m_scratch = T();
            return m_scratch;
        }
        return m_items[static_cast<size_t>(index)];
    }
    const T &operator[](int index) const {
        if (index < 0 || index >= count()) {
            SG_CONTAINER_WARNING(QStringLiteral("Index out of range in SgTArray::operator[]"));
            m_scratch = T();
            return m_scratch;
        }
        return m_items[static_cast<size_t>(index)];
    }

    // Appends `value` and returns its index. Amortised O(1).
    int append(const T &value) {
        reserveFor(m_items.size() + 1);
        m_items.push_back(value);
        return count() - 1;
    }

    // Appends `size` default-valued elements and returns the index of the first one. A
    // negative size is reported with "Invalid size '<size>' passed to SgTArray::addSpace()" and
    // returns -1; a size of 0 adds nothing and returns count().
    int addSpace(int size) {
        if (size < 0) {
            SG_CONTAINER_WARNING(
                QStringLiteral("Invalid size '%1' passed to SgTArray::addSpace()").arg(size));
            return -1;
        }
        const int first = count();
        reserveFor(m_items.size() + static_cast<size_t>(size));
        m_items.resize(m_items.size() + static_cast<size_t>(size));
        return first;
    }

    // Removes `removeCount` elements starting at `start`, keeping the order of the rest, and
    // returns true. A start outside [0, count()) is reported with "Invalid starting index
    // specified in SgTArray::removeByIndex()"; a range that runs past the end with "Too many
    // items specified for removal in SgTArray::removeByIndex()"; both return false and remove
    // nothing. A count of 0 or less removes nothing. O(count()).
    bool removeByIndex(int start, int removeCount = 1) {
        if (start < 0 || start >= count()) {
            SG_CONTAINER_WARNING(
                QStringLiteral("Invalid starting index specified in SgTArray::removeByIndex()"));
            return false;
        }
        if (removeCount <= 0)
            return removeCount == 0;
        if (removeCount > count() - start) {
            SG_CONTAINER_WARNING(QStringLiteral(
                "Too many items specified for removal in SgTArray::removeByIndex()"));
            return false;
        }
        const auto first = m_items.begin() + start;
        m_items.erase(first, first + removeCount);
        return true;
    }

    // Index of the first element equal to `value`, or -1. O(count()).
    int find(const T &value) const {
        const auto it = std::find(m_items.begin(), m_items.end(), value);
        return it == m_items.end() ? -1 : static_cast<int>(it - m_items.begin());
    }
    bool contains(const T &value) const { return find(value) >= 0; }

    // Removes every element; keeps the growth step.
    void clear() { m_items.clear(); }

    // Contiguous storage of count() elements (null when empty is allowed).
    T *data() { return m_items.data(); }
    const T *data() const { return m_items.data(); }

    auto begin() { return m_items.begin(); }
    auto end() { return m_items.end(); }
    auto begin() const { return m_items.begin(); }
    auto end() const { return m_items.end(); }

private:
    // Grows the capacity to the next multiple of the growth step that holds `needed` elements.
    void reserveFor(size_t needed) {
        if (needed <= m_items.capacity())
            return;
        const size_t step = static_cast<size_t>(m_growthStep);
        const size_t stepped = (needed + step - 1) / step * step;
        m_items.reserve(std::max(stepped, m_items.capacity() * 2));
    }

    std::vector<T> m_items;
    int m_growthStep;
    mutable T m_scratch{};
};
