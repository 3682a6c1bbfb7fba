#pragma once

#include <QStringList>
#include <QVariant>
#include <QVariantMap>

// A set of named import or export options (for example the OBJ importer's "Scale"), as the
// import presets and the importers' option pages hold them. Values are plain QVariants (bool,
// int, double, string). The set travels as text through `toString` and `fromString`, which is
// how a caller's options are copied over an importer's defaults.
class SgFileIOSettings {
public:
    SgFileIOSettings() = default;

    // Stores `value` under `key`, replacing any previous value. O(log n).
    void setValue(const QString &key, const QVariant &value);
    // The value under `key`, or `defaultValue` when there is none. O(log n).
    QVariant value(const QString &key, const QVariant &defaultValue = QVariant()) const;
    // Typed reads with a default for a missing key or a value that does not convert.
    bool boolValue(const QString &key, bool defaultValue) const;
    int intValue(const QString &key, int defaultValue) const;
    double doubleValue(const QString &key, double defaultValue) const;
    QString stringValue(const QString &key, const QString &defaultValue) const;

    bool contains(const QString &key) const { return m_values.contains(key); }
    QStringList keys() const { return m_values.keys(); }
    bool isEmpty() const { return m_values.isEmpty(); }
    void remove(const QString &key) { m_values.remove(key); }
    void clear() { m_values.clear(); }

    // The whole set as one line of text (a compact JSON object, keys sorted).
    QString toString() const;
    // Reads text written by `toString` and stores each of its options over the current ones;
    // options that the text does not name keep their values. Text that is not such an object
    // (empty, truncated, another JSON type) changes nothing and returns false. Values that are
    // not bool, number or string are skipped. O(text length).
    bool fromString(const QString &text);

    bool operator==(const SgFileIOSettings &other) const { return m_values == other.m_values; }

private:
    QVariantMap m_values;
};
