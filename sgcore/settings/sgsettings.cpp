#include "sgcore/settings/sgsettings.h"

#include <QDomDocument>
#include <QDomElement>
#include <algorithm>
#include <cmath>

namespace {

const QString SettingTag = QStringLiteral("Setting");
const QString KeyAttribute = QStringLiteral("Key");
const QString TypeAttribute = QStringLiteral("Type");
const QString ValueAttribute = QStringLiteral("Value");

QVariant storedForm(const QVariant &value) {
    switch (value.typeId()) {
    case QMetaType::Bool:
    case QMetaType::Int:
    case QMetaType::Float:
    case QMetaType::Double:
    case QMetaType::QString:
        return value;
    default:
        return value.toString();
    }
}

QString typeName(const QVariant &value) {
    switch (value.typeId()) {
    case QMetaType::Bool:
        return QStringLiteral("Bool");
    case QMetaType::Int:
        return QStringLiteral("Int");
    case QMetaType::Float:
        return QStringLiteral("Float");
    case QMetaType::Double:
        return QStringLiteral("Double");
    default:
        return QStringLiteral("String");
    }
}

QString valueText(const QVariant &value) {
    switch (value.typeId()) {
    case QMetaType::Bool:
        return value.toBool() ? QStringLiteral("1") : QStringLiteral("0");
    case QMetaType::Float:
        // Nine significant digits restore every float exactly.
        return QString::number(double(value.toFloat()), 'g', 9);
    case QMetaType::Double:
        return QString::number(value.toDouble(), 'g', 17);
    default:
        return value.toString();
    }
}

bool parseValue(const QString &type, const QString &text, QVariant &value) {
    bool ok = false;
    if (type == QLatin1String("Bool")) {
        ok = text == QLatin1String("0") || text == QLatin1String("1");
        value = text == QLatin1String("1");
    } else if (type == QLatin1String("Int")) {
        value = text.toInt(&ok);
    } else if (type == QLatin1String("Float")) {
        // Read as double first: the nine-digit form of the largest floats lies just above the
        // float range and still rounds back to them.
        const float parsed = float(text.toDouble(&ok));
        ok = ok && std::isfinite(parsed);
        value = parsed;
    } else if (type == QLatin1String("Double")) {
        const double parsed = text.toDouble(&ok);
        ok = ok && std::isfinite(parsed);
        value = parsed;
    } else if (type == QLatin1String("String")) {
        ok = true;
        value = text;
    }
    return ok;
}

} // namespace

SgSettings::SgSettings() = default;

SgSettings::~SgSettings() = default;

void SgSettings::setValue(const QString &key, const QVariant &value) {
    for (auto &entry : m_values) {
        if (entry.first == key) {
            entry.second = storedForm(value);
            return;
        }
    }
    m_values.append({key, storedForm(value)});
}

QVariant SgSettings::value(const QString &key, const QVariant &defaultValue) const {
    for (const auto &entry : m_values) {
        if (entry.first == key)
            return entry.second;
    }
    return defaultValue;
}

bool SgSettings::contains(const QString &key) const {
    return std::any_of(m_values.begin(), m_values.end(),
                       [&key](const auto &entry) { return entry.first == key; });
}

void SgSettings::remove(const QString &key) {
    m_values.removeIf([&key](const auto &entry) { return entry.first == key; });
}

QStringList SgSettings::keys() const {
    QStringList result;
    for (const auto &entry : m_values)
        result.append(entry.first);
    return result;
}

void SgSettings::toDOM(QDomDocument &document, QDomElement &element) const {
    for (const auto &[key, value] : m_values) {
        QDomElement setting = document.createElement(SettingTag);
        setting.setAttribute(KeyAttribute, key);
        setting.setAttribute(TypeAttribute, typeName(value));
        setting.setAttribute(ValueAttribute, valueText(value));
        element.appendChild(setting);
    }
}

bool SgSettings::fromDOM(const QDomElement &element) {
    clear();
    bool allRead = true;
    for (QDomElement setting = element.firstChildElement(SettingTag); !setting.isNull();
         setting = setting.nextSiblingElement(SettingTag)) {
        const QString key = setting.attribute(KeyAttribute);
        QVariant value;
        if (key.isEmpty() || !parseValue(setting.attribute(TypeAttribute),
                                         setting.attribute(ValueAttribute), value)) {
            allRead = false;
            continue;
        }
        setValue(key, value);
    }
    return allRead;
}
