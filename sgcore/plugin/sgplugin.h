#pragma once

#include <QList>
#include <QString>

class SgClassFactory;

// The definition a plug-in library hands to the host: its name, author, version, description
// and the class factories it contributes. A plug-in keeps one such object with static storage;
// the host reads it after loading the library and never deletes it.
class SgPlugin {
public:
    SgPlugin(const QString &name, const QString &author, const QString &description,
             quint32 version);
    ~SgPlugin();

    SgPlugin(const SgPlugin &) = delete;
    SgPlugin &operator=(const SgPlugin &) = delete;

    void setAuthor(const QString &author) { m_author = author; }
    void setDescription(const QString &description) { m_description = description; }
    // The plug-in's own version, four bytes from the most significant: major, minor, build, patch.
    void setVersion(quint32 version) { m_version = version; }

    const QString &getName() const { return m_name; }
    const QString &getAuthor() const { return m_author; }
    const QString &getDescription() const { return m_description; }
    quint32 getVersion() const { return m_version; }

    // Appends a factory (not owned; the plug-in keeps it alive as long as the definition).
    // A factory added twice is listed once.
    void addClassFactory(SgClassFactory *factory);

    // The factories in the order they were added.
    const QList<SgClassFactory *> &getClassFactories() const { return m_factories; }

private:
    QString m_name;
    QString m_author;
    QString m_description;
    quint32 m_version = 0;
    QList<SgClassFactory *> m_factories;
};
