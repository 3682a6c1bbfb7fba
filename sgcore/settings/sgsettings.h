#pragma once

#include <QList>
#include <QPair>
#include <QString>
#include <QVariant>

class QDomDocument;
class QDomElement;

// An ordered set of named values (bool, 32-bit int, float, double or string) that can be written
// into and read back from a DOM element without loss: floats and doubles are written with enough
// digits to restore the same bits.
//
// DOM layout: one child element "Setting" per value, in insertion order, with the attributes
// "Key", "Type" ("Bool", "Int", "Float", "Double" or "String") and "Value".
class SgSettings {
public:
    SgSettings();
    virtual ~SgSettings();

    // Sets `key` to `value`; a key already present keeps its place. Values of any other type than
    // the five above are stored as their string form. Cost: linear in the number of keys.
    void setValue(const QString &key, const QVariant &value);

    // The value of `key`, or `defaultValue` when the key is absent.
    QVariant value(const QString &key, const QVariant &defaultValue = QVariant()) const;

    bool contains(const QString &key) const;
    void remove(const QString &key);
    void clear() { m_values.clear(); }
    int count() const { return int(m_values.size()); }
    bool isEmpty() const { return m_values.isEmpty(); }

    // The keys, in insertion order.
    QStringList keys() const;

    // Appends one "Setting" element per value to `element` (elements made by `document`).
    void toDOM(QDomDocument &document, QDomElement &element) const;

    // Replaces the values by those of the "Setting" children of `element`. Children with another
    // tag are ignored. A child with a missing key, an unknown type or a value that does not parse
    // as its type is skipped and makes the result false; the others are still read.
    bool fromDOM(const QDomElement &element);

    bool operator==(const SgSettings &other) const { return m_values == other.m_values; }

private:
    QList<QPair<QString, QVariant>> m_values;
};
