#pragma once

#include <QByteArray>
#include <QString>

#include <functional>

class QDomDocument;
class QDomElement;
class QWidget;
class SgMorphConfigurationDocument;
struct SgConfigurationElement;
class SgMorphFileItem;
class SgMorphSourceItem;
class SgMorphSourceList;

// The configuration files (".scx") of the morph loader: an object file holds one source's
// whole settings tree, a project file lists sources by geometry path. Both are XML, written in
// one piece with an indent of one space and no declaration:
//
//   <VarnTargetImporter Version="1">
//    <FileType Type="Object">      (or "Project", then one <Object Name=".." Path=".."/> per
//    source)
//     <ScenaraExported Value="False"> ... one element per setting row, nested like the rows
//
// A stored path is relative when it starts with "/" but not with "//"; it is resolved by
// putting the base folder in front of it. Because absolute paths on this platform also start
// with "/", such a path is taken as it is when the resolved one does not exist and it does.
//
// Reading takes untrusted bytes: `SgMorphConfigurationDocument` turns them into plain data (or
// a load error) without touching any widget; this class then applies that data to the rows.
// Every fault ends in one "Load Error" warning (parented to the message parent) or in a source
// with default settings, never in a crash.
class SgMorphConfiguration {
public:
    // Rows are added to and read from `list`; warnings are parented to `messageParent`.
    SgMorphConfiguration(SgMorphSourceList *list, QWidget *messageParent);

    bool relativePaths() const { return m_relativePaths; }
    void setRelativePaths(bool on) { m_relativePaths = on; }
    bool saveObjectConfigurations() const { return m_saveObjectConfigurations; }
    void setSaveObjectConfigurations(bool on) { m_saveObjectConfigurations = on; }

    // Receives each warning (title, text) instead of a modal box; for callers without a user,
    // such as batch tools. Null restores the boxes.
    using MessageHandler = std::function<void(const QString &title, const QString &text)>;
    void setMessageHandler(MessageHandler handler) { m_messageHandler = std::move(handler); }

    // The bytes of the object file of `source` (empty when the source has no setting rows).
    // With relative paths the pose path is stored relative to `base`. Cost: linear in the rows.
    QByteArray objectDocument(SgMorphFileItem *source, const QString &base);
    // Writes the object file of `source` to `path` (".scx" appended unless present). A source
    // without setting rows writes no file. False when nothing was written.
    bool saveObjectConfiguration(QString path, SgMorphFileItem *source, const QString &base);
    // Writes the project file to `path` (".scx" appended unless present) and, with object
    // configurations on, each source's object file next to its geometry.
    bool saveProjectConfiguration(QString path);
    // The form of `path` relative to the folder `base` when `path` lies in it (`ok` set);
    // otherwise the "Relative Path Warning" and `path` unchanged (`ok` cleared).
    QString makeRelative(const QString &base, const QString &path, bool &ok);

    // Reads a configuration file of either kind; `base` resolves an object file's pose path.
    // False after a "Load Error".
    bool loadConfigurationFile(const QString &path, const QString &base);
    // Reads the object file of a project entry; false after a "Load Error".
    bool loadObjectConfiguration(const QString &path, const QString &base, SgMorphFileItem *target);
    // Applies the elements below `fileType` to the rows of `target`, a parent row before its
    // dependent rows. A "Property" element's attributes go to the loader's own unattached
    // control property (a new float property when the current one belongs to the scene).
    void applyObjectConfiguration(SgConfigurationElement fileType, const QString &base,
                                  SgMorphFileItem *target);

    // Whether a stored path is in relative form.
    static bool isRelative(const QString &path);
    // The path that the stored `path` names, relative ones resolved against `base`.
    static QString resolvePath(const QString &base, const QString &path);

private:
    bool readDocument(const QString &path, SgMorphConfigurationDocument &document);
    void loadProjectObjects(const SgConfigurationElement &fileType, const QString &projectPath);
    SgMorphFileItem *sourceFor(const QString &geometryPath);
    void appendRow(QDomDocument &document, QDomElement &parent, SgMorphSourceItem *row);
    void applyRow(SgMorphSourceItem *row, const SgConfigurationElement &scope);
    bool writeFile(const QString &path, const QByteArray &bytes);
    void loadError(const QString &text);
    void warn(const QString &title, const QString &text, const QString &button);

    SgMorphSourceList *m_list;
    QWidget *m_messageParent;
    bool m_relativePaths = true;
    bool m_saveObjectConfigurations = true;
    MessageHandler m_messageHandler;
};
