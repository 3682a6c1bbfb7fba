#include "sgcore/importer/sgfileiosettings.h"

#include <QJsonDocument>
#include <QJsonObject>
#include <QJsonValue>

void SgFileIOSettings::setValue(const QString &key, const QVariant &value) {
    m_values.insert(key, value);
}

QVariant SgFileIOSettings::value(const QString &key, const QVariant &defaultValue) const {
    return m_values.value(key, defaultValue);
}

bool SgFileIOSettings::boolValue(const QString &key, bool defaultValue) const {
    const QVariant v = m_values.value(key);
    if (!v.isValid())
        return defaultValue;
    if (v.typeId() == QMetaType::QString) {
        const QString s = v.toString().trimmed().toLower();
        if (s == QLatin1String("true") || s == QLatin1String("1") || s == QLatin1String("yes"))
            return true;
        if (s == QLatin1String("false") || s == QLatin1String("0") || s == QLatin1String("no"))
            return false;
        return defaultValue;
    }
    return v.canConvert<bool>() ? v.toBool() : defaultValue;
}

int SgFileIOSettings::intValue(const QString &key, int defaultValue) const {
    bool ok = false;
    const int result = m_values.value(key).toInt(&ok);
    return ok ? result : defaultValue;
}

double SgFileIOSettings::doubleValue(const QString &key, double defaultValue) const {
    bool ok = false;
    const double result = m_values.value(key).toDouble(&ok);
    return ok ? result : defaultValue;
}

QString SgFileIOSettings::stringValue(const QString &key, const QString &defaultValue) const {
    const QVariant v = m_values.value(key);
    return v.isValid() ? v.toString() : defaultValue;
}

QString SgFileIOSettings::toString() const {
    const QJsonObject object = QJsonObject::fromVariantMap(m_values);
    return QString::fromUtf8(QJsonDocument(object).toJson(QJsonDocument::Compact));
}

bool SgFileIOSettings::fromString(const QString &text) {
    QJsonParseError error{};
    const QJsonDocument document = QJsonDocument::fromJson(text.toUtf8(), &error);
    if (error.error != QJsonParseError::NoError || !document.isObject())
        return false;
    const QJsonObject object = document.object();
    for (auto it = object.begin(); it != object.end(); ++it) {
        const QJsonValue value = it.value();
        if (value.isBool() || value.isDouble() || value.isString())
            m_values.insert(it.key(), value.toVariant());
    }
    return true;
}
