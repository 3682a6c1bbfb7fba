#include "sgcore/geometry/sgrefcounteditem.h"

int SgRefCountedItem::unref() {
    if (m_refCount > 0) {
        --m_refCount;
    }
    if (m_refCount == 0) {
        delete this;
        return 0;
    }
    return m_refCount;
}
