#pragma once

#include "sgcore/containers/sgcontainerwarning.h"

#include <vector>

// A resizable array of plain values (numbers, pointers, small structs) with checked indexing:
// a thin wrapper around std::vector for bulk data such as vertex indices.
template <typename T> class SgTSimpleArray {
public:
    SgTSimpleArray() = default;
    // An array of `size` default-valued elements (none when `size` is negative).
    explicit SgTSimpleArray(int size) { resize(size); }

    // Number of elements. O(1).
    int count() const { return static_cast<int>(m_items.size()); }
    bool isEmpty() const { return m_items.empty(); }

    // Sets the number of elements; new elements are default-valued. A negative size empties
    // the array.
    void resize(int size) { m_items.resize(size > 0 ? static_cast<size_t>(size) : 0); }

    // The element at `index`. An index outside [0, count()) is reported with
    // "Illegal array index in SgTSimpleArray::operator[]" and yields a default-valued scratch
    // element that belongs to no position. O(1).
    T &operator[](int index) {
        if (index < 0 || index >= count()) {
            SG_CONTAINER_WARNING(
                QStringLiteral("Illegal array index in SgTSimpleArray::operator[]"));
            m_scratch = T();
            return m_scratch;
        }
        return m_items[static_cast<size_t>(index)];
    }
    const T &operator[](int index) const {
        if (index < 0 || index >= count()) {
            SG_CONTAINER_WARNING(
                QStringLiteral("Illegal array index in SgTSimpleArray::operator[]"));
            m_scratch = T();
            return m_scratch;
        }
        return m_items[static_cast<size_t>(index)];
    }

    // Appends `value` and returns its index. Amortised O(1).
    int append(const T &value) {
        m_items.push_back(value);
        return count() - 1;
    }

    // Index of the first element equal to `value`, or -1. O(count()).
    int find(const T &value) const {
        for (size_t i = 0; i < m_items.size(); ++i) {
            if (m_items[i] == value)
                return static_cast<int>(i);
        }
        return -1;
    }

    void clear() { m_items.clear(); }

    // Contiguous storage of count() elements.
    T *data() { return m_items.data(); }
    const T *data() const { return m_items.data(); }

    auto begin() { return m_items.begin(); }
    auto end() { return m_items.end(); }
    auto begin() const { return m_items.begin(); }
    auto end() const { return m_items.end(); }

private:
    std::vector<T> m_items;
    mutable T m_scratch{};
};
