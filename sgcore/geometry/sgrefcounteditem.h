#pragma once

// Base of shared geometry: reference counted, deleted when the last reference goes.
// A new item starts with a count of 0, so its creator either hands it to an owner that takes a
// reference (a shape, a welder, a caller that calls `ref`) or deletes it directly.
class SgRefCountedItem {
public:
    SgRefCountedItem() = default;
    SgRefCountedItem(const SgRefCountedItem &) : m_refCount(0) {}
    SgRefCountedItem &operator=(const SgRefCountedItem &) { return *this; }
    virtual ~SgRefCountedItem() = default;

    // Takes one reference; returns the new count.
    int ref() { return ++m_refCount; }
    // Drops one reference and deletes the item when none is left; returns the new count
    // (0 means the item is gone). Calling it on an item with no reference deletes the item.
    int unref();
    int getRefCount() const { return m_refCount; }

private:
    int m_refCount = 0;
};
