#include "sharedsource/loaderui/sgmorphconfiguration.h"

#include "sgcore/app/sgapp.h"
#include "sgcore/io/sgfileio.h"
#include "sgcore/properties/sgfloatproperty.h"
#include "sgcore/settings/sgpropertysettings.h"
#include "sharedsource/loaderui/sgmorphconfigurationdocument.h"
#include "sharedsource/loaderui/sgmorphfileitem.h"
#include "sharedsource/loaderui/sgmorphsourceitem.h"
#include "sharedsource/loaderui/sgmorphsourcelist.h"

#include <QCoreApplication>
#include <QDomDocument>
#include <QFile>
#include <QFileInfo>
#include <QMessageBox>

namespace {
const QString s_rootTag = QStringLiteral("VarnTargetImporter");
const QString s_extension = QStringLiteral(".scx");
const QString s_value = QStringLiteral("Value");

QString tr(const char *text) {
    return QCoreApplication::translate("SgMorphLoaderDlg", text);
}

QString withExtension(const QString &path) {
    return path.endsWith(s_extension) ? path : path + s_extension;
}

// The first element below `scope` (its whole subtree, document order) tagged `tag`.
QDomElement firstElementBelow(const QDomElement &scope, const QString &tag) {
    QDomNode node = scope.firstChild();
    while (!node.isNull() && node != scope) {
        if (node.isElement() && node.nodeName() == tag)
            return node.toElement();
        if (node.hasChildNodes()) {
            node = node.firstChild();
            continue;
        }
        while (!node.isNull() && node != scope && node.nextSibling().isNull())
            node = node.parentNode();
        if (node.isNull() || node == scope)
            break;
        node = node.nextSibling();
    }
    return QDomElement();
}

SgMorphSourceItem *settingRow(QTreeWidgetItem *item) {
    return item && item->type() == SgMorphSourceItem::Type ? static_cast<SgMorphSourceItem *>(item)
                                                           : nullptr;
}
} // namespace

SgMorphConfiguration::SgMorphConfiguration(SgMorphSourceList *list, QWidget *messageParent)
    : m_list(list), m_messageParent(messageParent) {}

bool SgMorphConfiguration::isRelative(const QString &path) {
    return path.startsWith(QLatin1Char('/')) && !path.startsWith(QLatin1String("//"));
}

QString SgMorphConfiguration::resolvePath(const QString &base, const QString &path) {
    if (!isRelative(path))
        return path;
    const QString resolved = base + path;
    if (!QFileInfo::exists(resolved) && QFileInfo::exists(path))
        return path;
    return resolved;
}

// ---------------------------------------------------------------------------------------------
// Writing

QString SgMorphConfiguration::makeRelative(const QString &base, const QString &path, bool &ok) {
    // Only a path inside the folder is made relative; the folder's text elsewhere in the path,
    // or a sibling folder that merely starts with the same text, keeps the path absolute.
    const QString folder = base.endsWith(QLatin1Char('/')) ? base.chopped(1) : base;
    if (!folder.isEmpty() && path.startsWith(folder + QLatin1Char('/'))) {
        ok = true;
        return path.mid(folder.size());
    }
    warn(tr("Relative Path Warning"),
         tr("The file, ") + path +
             tr(",is not in the relative path and will be saved as absolute."),
         tr("Ok."));
    ok = false;
    return path;
}

void SgMorphConfiguration::appendRow(QDomDocument &document, QDomElement &parent,
                                     SgMorphSourceItem *row) {
    QDomElement element = document.createElement(row->settingKey());
    element.setAttribute(s_value, row->valueText());
    if (row->settingType() == 4) {
        if (SgNumericProperty *property = row->loader()->controlProperty()) {
            SgPropertySettings attributes;
            property->getAttributes(attributes);
            attributes.toDOM(document, element);
        }
    } else {
        for (int i = 0; i < row->childCount(); ++i)
            if (SgMorphSourceItem *child = settingRow(row->child(i)))
                appendRow(document, element, child);
    }
    parent.appendChild(element);
}

namespace {

// Starts a configuration document: the root element with its version, and below it the
// "FileType" element of `type` ("Object" or "Project"), which is returned to be filled.
QDomElement beginDocument(QDomDocument &document, const QString &rootTag, const QString &type) {
    QDomElement root = document.createElement(rootTag);
    root.setAttribute(QStringLiteral("Version"), QStringLiteral("1"));
    document.appendChild(root);
    QDomElement fileType = document.createElement(QStringLiteral("FileType"));
    fileType.setAttribute(QStringLiteral("Type"), type);
    root.appendChild(fileType);
    return fileType;
}

} // namespace

QByteArray SgMorphConfiguration::objectDocument(SgMorphFileItem *source, const QString &base) {
    if (!source || source->childCount() == 0)
        return QByteArray();
    QDomDocument document;
    QDomElement fileType = beginDocument(document, s_rootTag, QStringLiteral("Object"));
    for (int i = 0; i < source->childCount(); ++i)
        if (SgMorphSourceItem *row = settingRow(source->child(i)))
            appendRow(document, fileType, row);
    if (m_relativePaths) {
        QDomElement pose = firstElementBelow(fileType, QStringLiteral("Pose"));
        const QString value = pose.attribute(s_value);
        if (!pose.isNull() && !value.isEmpty() && value != QLatin1String("None")) {
            bool ok = false;
            pose.setAttribute(s_value, makeRelative(base, value, ok));
        }
    }
    return document.toByteArray(1);
}

bool SgMorphConfiguration::writeFile(const QString &path, const QByteArray &bytes) {
    QFile file(path);
    if (!file.open(QIODevice::WriteOnly | QIODevice::Truncate) ||
        file.write(bytes) != bytes.size()) {
        if (sgApp)
            sgApp->log(QStringLiteral("Could not write the configuration file %1").arg(path));
        return false;
    }
    return true;
}

bool SgMorphConfiguration::saveObjectConfiguration(QString path, SgMorphFileItem *source,
                                                   const QString &base) {
    path = withExtension(path);
    const QByteArray bytes = objectDocument(source, base);
    return !bytes.isEmpty() && writeFile(path, bytes);
}

bool SgMorphConfiguration::saveProjectConfiguration(QString path) {
    path = withExtension(path);
    const QString projectFolder = SgFileIO::getFilePath(path);
    QDomDocument document;
    QDomElement fileType = beginDocument(document, s_rootTag, QStringLiteral("Project"));
    for (int i = 0; i < m_list->topLevelItemCount(); ++i) {
        QTreeWidgetItem *row = m_list->topLevelItem(i);
        const QString geometryPath = row->text(1);
        QString stored = geometryPath;
        if (m_relativePaths) {
            bool ok = false;
            stored = makeRelative(projectFolder, geometryPath, ok);
        }
        QDomElement object = document.createElement(QStringLiteral("Object"));
        object.setAttribute(QStringLiteral("Name"), row->text(0));
        object.setAttribute(QStringLiteral("Path"), stored);
        fileType.appendChild(object);
        if (m_saveObjectConfigurations && row->type() == SgMorphFileItem::Type)
            saveObjectConfiguration(geometryPath, static_cast<SgMorphFileItem *>(row),
                                    projectFolder);
    }
    return writeFile(path, document.toByteArray(1));
}

// ---------------------------------------------------------------------------------------------
// Reading

void SgMorphConfiguration::warn(const QString &title, const QString &text, const QString &button) {
    if (m_messageHandler) {
        m_messageHandler(title, text);
        return;
    }
    QMessageBox box(QMessageBox::Warning, title, text, QMessageBox::NoButton, m_messageParent);
    box.addButton(button, QMessageBox::AcceptRole);
    box.exec();
}

void SgMorphConfiguration::loadError(const QString &text) {
    warn(tr("Load Error"), text, tr("Ok"));
}

bool SgMorphConfiguration::readDocument(const QString &path,
                                        SgMorphConfigurationDocument &document) {
    QFile file(path);
    if (!file.open(QIODevice::ReadOnly)) {
        loadError(tr("Error: Could not open file"));
        return false;
    }
    // A file over the limit is not read at all; reading one byte more tells a file that grew.
    const qint64 limit = SgMorphConfigurationDocument::maxFileSize;
    const QByteArray bytes = file.size() <= limit ? file.read(limit + 1) : QByteArray();
    if (!document.read(bytes)) {
        loadError(document.error());
        return false;
    }
    return true;
}

SgMorphFileItem *SgMorphConfiguration::sourceFor(const QString &geometryPath) {
    for (int i = 0; i < m_list->topLevelItemCount(); ++i) {
        QTreeWidgetItem *row = m_list->topLevelItem(i);
        if (row->type() != SgMorphFileItem::Type)
            break;
        auto *source = static_cast<SgMorphFileItem *>(row);
        if (source->loader().filename() == geometryPath)
            return source;
    }
    m_list->addFile(geometryPath);
    QTreeWidgetItem *top = m_list->topLevelItem(0);
    return top && top->type() == SgMorphFileItem::Type ? static_cast<SgMorphFileItem *>(top)
                                                       : nullptr;
}

bool SgMorphConfiguration::loadConfigurationFile(const QString &path, const QString &base) {
    SgMorphConfigurationDocument document;
    if (!readDocument(path, document))
        return false;
    const QString type = document.type();
    if (type == QLatin1String("Project")) {
        loadProjectObjects(document.fileType(), path);
        return true;
    }
    if (type != QLatin1String("Object")) {
        loadError(tr("XML Parse error, Improper Configuration type."));
        return false;
    }
    const QString geometryPath =
        path.endsWith(s_extension) ? path.chopped(s_extension.size()) : path;
    if (geometryPath == path || !QFileInfo(geometryPath).isFile()) {
        loadError(tr("Could not locate Object file, make sure the file is located in the same "
                     "directory as the Configuration."));
        return false;
    }
    applyObjectConfiguration(document.fileType(), base, sourceFor(geometryPath));
    return true;
}

void SgMorphConfiguration::loadProjectObjects(const SgConfigurationElement &fileType,
                                              const QString &projectPath) {
    const QString projectFolder = SgFileIO::getFilePath(projectPath);
    const QList<const SgConfigurationElement *> objects =
        fileType.allBelow(QStringLiteral("Object"));
    // New rows go to the top, so the entries are added from the last to the first.
    for (qsizetype i = objects.size() - 1; i >= 0; --i) {
        const QString path =
            resolvePath(projectFolder, objects[i]->attributes.value(QStringLiteral("Path")));
        if (path.isEmpty() || !QFileInfo(path).isFile())
            continue;
        SgMorphFileItem *source = sourceFor(path);
        const QString objectFile = withExtension(path);
        if (source && QFileInfo(objectFile).isFile())
            loadObjectConfiguration(objectFile, projectFolder, source);
    }
}

bool SgMorphConfiguration::loadObjectConfiguration(const QString &path, const QString &base,
                                                   SgMorphFileItem *target) {
    SgMorphConfigurationDocument document;
    if (!readDocument(path, document))
        return false;
    if (document.type() != QLatin1String("Object")) {
        loadError(tr("XML Parse error, Improper Configuration type."));
        return false;
    }
    applyObjectConfiguration(document.fileType(), base, target);
    return true;
}

void SgMorphConfiguration::applyObjectConfiguration(SgConfigurationElement fileType,
                                                    const QString &base, SgMorphFileItem *target) {
    if (!target || !fileType.hasChildNodes)
        return;
    const QString valueKey = QStringLiteral("Value");
    if (SgConfigurationElement *pose = fileType.firstBelow(QStringLiteral("Pose"));
        pose && isRelative(pose->value()))
        pose->attributes.insert(valueKey, resolvePath(base, pose->value()));
    for (int i = 0; i < target->childCount(); ++i) {
        SgMorphSourceItem *row = settingRow(target->child(i));
        if (!row)
            continue;
        const SgConfigurationElement *element = fileType.firstBelow(row->settingKey());
        row->setValueText(element ? element->value() : QString());
        if (!element)
            continue;
        for (int c = 0; c < row->childCount(); ++c)
            if (SgMorphSourceItem *child = settingRow(row->child(c)))
                applyRow(child, *element);
    }
}

// Sets `row` from the first element below `scope` with its key, then its dependent rows from
// below that element; a row without an element keeps its value.
void SgMorphConfiguration::applyRow(SgMorphSourceItem *row, const SgConfigurationElement &scope) {
    const SgConfigurationElement *element = scope.firstBelow(row->settingKey());
    if (!element)
        return;
    row->setValueText(element->value());
    if (row->settingType() == 4 && element->hasChildNodes) {
        SgMorphLoader *loader = row->loader();
        // The attributes go to a property of the loader's own: one the scene holds (or a
        // control morph carries) is never renamed behind the user's back.
        SgNumericProperty *property = loader->controlProperty();
        if (!property || property->getOwner())
            property = new SgFloatProperty;
        property->setAttributes(element->propertyAttributes);
        loader->setControlProperty(property);
    }
    for (int c = 0; c < row->childCount(); ++c)
        if (SgMorphSourceItem *child = settingRow(row->child(c)))
            applyRow(child, *element);
}
