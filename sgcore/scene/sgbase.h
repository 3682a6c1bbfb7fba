#pragma once

#include <QString>

// The root of the host's named objects: one name, used for lookups (properties, materials,
// face groups, bones). Polymorphic, so callers test kinds with dynamic_cast.
class SgBase {
public:
    SgBase() = default;
    explicit SgBase(const QString &name) : m_name(name) {}
    SgBase(const SgBase &) = default;
    SgBase &operator=(const SgBase &) = default;
    virtual ~SgBase() = default;

    QString getName() const { return m_name; }
    virtual void setName(const QString &name) { m_name = name; }

private:
    QString m_name;
};
