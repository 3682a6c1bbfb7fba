#include "sgcore/app/sgappsettings.h"

#include <QSettings>
#include <QStandardPaths>

namespace {
QString &settingsFile() {
    static QString file;
    return file;
}
} // namespace

QString SgAppSettings::fileName() {
    if (settingsFile().isEmpty()) {
        return QStandardPaths::writableLocation(QStandardPaths::AppConfigLocation) +
               QStringLiteral("/scenara.ini");
    }
    return settingsFile();
}

void SgAppSettings::setFileName(const QString &path) {
    settingsFile() = path;
}

SgAppSettings::SgAppSettings(const QString &group)
    : m_group(group), m_settings(std::make_unique<QSettings>(fileName(), QSettings::IniFormat)) {
    if (!group.isEmpty()) {
        m_settings->beginGroup(group);
    }
}

SgAppSettings::~SgAppSettings() = default;

QVariant SgAppSettings::getValue(const QString &key, const QVariant &defaultValue) const {
    return m_settings->value(key, defaultValue);
}

void SgAppSettings::setValue(const QString &key, const QVariant &value) {
    m_settings->setValue(key, value);
}

int SgAppSettings::getInt(const QString &key, int defaultValue) const {
    bool ok = false;
    const int v = m_settings->value(key).toInt(&ok);
    return ok ? v : defaultValue;
}

void SgAppSettings::setInt(const QString &key, int value) {
    m_settings->setValue(key, value);
}

bool SgAppSettings::getBool(const QString &key, bool defaultValue) const {
    const QVariant v = m_settings->value(key);
    if (!v.isValid()) {
        return defaultValue;
    }
    const QString s = v.toString().trimmed().toLower();
    if (s == QLatin1String("true") || s == QLatin1String("1")) {
        return true;
    }
    if (s == QLatin1String("false") || s == QLatin1String("0")) {
        return false;
    }
    return defaultValue;
}

void SgAppSettings::setBool(const QString &key, bool value) {
    m_settings->setValue(key, value);
}

double SgAppSettings::getDouble(const QString &key, double defaultValue) const {
    bool ok = false;
    const double v = m_settings->value(key).toDouble(&ok);
    return ok ? v : defaultValue;
}

void SgAppSettings::setDouble(const QString &key, double value) {
    m_settings->setValue(key, value);
}

QString SgAppSettings::getString(const QString &key, const QString &defaultValue) const {
    const QVariant v = m_settings->value(key);
    return v.isValid() ? v.toString() : defaultValue;
}

void SgAppSettings::setString(const QString &key, const QString &value) {
    m_settings->setValue(key, value);
}

bool SgAppSettings::contains(const QString &key) const {
    return m_settings->contains(key);
}

void SgAppSettings::remove(const QString &key) {
    m_settings->remove(key);
}

void SgAppSettings::sync() {
    m_settings->sync();
}
