#pragma once

#include <cstddef>
#include <vector>

// Appends items to a vector a batch at a time through a buffer on the stack: the vector grows
// by block moves instead of one push_back per item (a check of its room and an update of its
// size each, which the compiler must redo after every store that may alias them). With room
// reserved beforehand every byte of the vector is written once.
//
//   SgBatchAppender<SgVec3> out(vertices);
//   for (...) out.push(SgVec3(x, y, z));
//   // the rest goes in at out.flush() or at the appender's end
//
// The vector must not be touched otherwise while the appender holds items.
template <typename T, std::size_t N = 512> class SgBatchAppender {
public:
    explicit SgBatchAppender(std::vector<T> &to) : m_to(to) {}
    ~SgBatchAppender() { flush(); }
    SgBatchAppender(const SgBatchAppender &) = delete;
    SgBatchAppender &operator=(const SgBatchAppender &) = delete;

    void push(const T &item) {
        if (m_count == N)
            flush();
        m_batch.items[m_count++] = item;
    }

    void flush() {
        m_to.insert(m_to.end(), m_batch.items, m_batch.items + m_count);
        m_count = 0;
    }

private:
    // Storage that is not filled with default values first: each item is assigned once.
    union Batch {
        Batch() {}
        T items[N];
    };
    std::vector<T> &m_to;
    Batch m_batch;
    std::size_t m_count = 0;
};
