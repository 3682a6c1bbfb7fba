#pragma once

#include <QString>
#include <QVariant>

#include <memory>

class QSettings;

// The application's settings, kept in one INI file through QSettings. An instance reads and
// writes one group (none: the default group); values are typed and read with a default for
// when the key is absent or holds something that does not convert. Writes reach the file when
// the instance is destroyed or `sync` is called; every instance sees the others' writes.
class SgAppSettings {
public:
    explicit SgAppSettings(const QString &group = QString());
    ~SgAppSettings();
    SgAppSettings(const SgAppSettings &) = delete;
    SgAppSettings &operator=(const SgAppSettings &) = delete;

    QString getGroup() const { return m_group; }

    int getInt(const QString &key, int defaultValue = 0) const;
    void setInt(const QString &key, int value);
    bool getBool(const QString &key, bool defaultValue = false) const;
    void setBool(const QString &key, bool value);
    double getDouble(const QString &key, double defaultValue = 0.0) const;
    void setDouble(const QString &key, double value);
    QString getString(const QString &key, const QString &defaultValue = QString()) const;
    void setString(const QString &key, const QString &value);
    QVariant getValue(const QString &key, const QVariant &defaultValue = QVariant()) const;
    void setValue(const QString &key, const QVariant &value);

    bool contains(const QString &key) const;
    void remove(const QString &key);
    // Writes pending changes to the file.
    void sync();

    // The INI file every instance uses. By default the file "scenara.ini" in the user's
    // configuration folder (QStandardPaths::AppConfigLocation); tests point it elsewhere.
    static QString fileName();
    static void setFileName(const QString &path);

private:
    QString m_group;
    std::unique_ptr<QSettings> m_settings;
};
