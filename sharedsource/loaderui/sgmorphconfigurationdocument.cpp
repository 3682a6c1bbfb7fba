#include "sharedsource/loaderui/sgmorphconfigurationdocument.h"

#include <QCoreApplication>
#include <QDomDocument>
#include <QDomNamedNodeMap>
#include <QXmlStreamReader>

namespace {

const QString s_rootTag = QStringLiteral("VarnTargetImporter");

QString tr(const char *text) {
    return QCoreApplication::translate("SgMorphLoaderDlg", text);
}

// Whether `bytes` stay within the nesting limit (a deep document is refused, not parsed).
bool shallowEnough(const QByteArray &bytes) {
    QXmlStreamReader reader(bytes);
    int depth = 0;
    while (!reader.atEnd()) {
        const auto token = reader.readNext();
        if (token == QXmlStreamReader::StartElement &&
            ++depth > SgMorphConfigurationDocument::maxDepth)
            return false;
        if (token == QXmlStreamReader::EndElement)
            --depth;
    }
    return true;
}

// The element as plain data; the depth is bounded by shallowEnough.
SgConfigurationElement convert(const QDomElement &element) {
    SgConfigurationElement out;
    out.tag = element.tagName();
    const QDomNamedNodeMap attributes = element.attributes();
    for (int i = 0; i < attributes.count(); ++i) {
        const QDomAttr attribute = attributes.item(i).toAttr();
        out.attributes.insert(attribute.name(), attribute.value());
    }
    out.hasChildNodes = element.hasChildNodes();
    if (out.hasChildNodes)
        out.propertyAttributes.fromDOM(element);
    for (QDomElement child = element.firstChildElement(); !child.isNull();
         child = child.nextSiblingElement())
        out.children.append(convert(child));
    return out;
}

template <typename Element> Element *firstBelowIn(Element &scope, const QString &tag) {
    for (auto &child : scope.children) {
        if (child.tag == tag)
            return &child;
        if (Element *found = firstBelowIn(child, tag))
            return found;
    }
    return nullptr;
}

void collectBelow(const SgConfigurationElement &scope, const QString &tag,
                  QList<const SgConfigurationElement *> &out) {
    for (const auto &child : scope.children) {
        if (child.tag == tag)
            out.append(&child);
        collectBelow(child, tag, out);
    }
}

} // namespace

const SgConfigurationElement *SgConfigurationElement::firstBelow(const QString &tag) const {
    return firstBelowIn(*this, tag);
}

SgConfigurationElement *SgConfigurationElement::firstBelow(const QString &tag) {
    return firstBelowIn(*this, tag);
}

QList<const SgConfigurationElement *> SgConfigurationElement::allBelow(const QString &tag) const {
    QList<const SgConfigurationElement *> out;
    collectBelow(*this, tag, out);
    return out;
}

bool SgMorphConfigurationDocument::fail(const QString &error) {
    m_error = error;
    m_fileType = SgConfigurationElement();
    return false;
}

bool SgMorphConfigurationDocument::read(const QByteArray &bytes) {
    m_error.clear();
    m_fileType = SgConfigurationElement();
    QDomDocument document;
    if (bytes.isEmpty() || bytes.size() > maxFileSize || !shallowEnough(bytes) ||
        !document.setContent(bytes))
        return fail(tr("Error: Document could not set as xml."));
    const QDomElement root = document.documentElement();
    if (root.isNull())
        return fail(tr("No Root Element Found"));
    if (root.tagName() != s_rootTag)
        return fail(
            tr("Unexpected Root tag name '%1'...Expected '%2'").arg(root.tagName(), s_rootTag));
    if (!root.hasChildNodes())
        return fail(tr("Root Element Has No Children"));
    const QDomElement fileType = root.firstChild().toElement();
    if (!fileType.isNull())
        m_fileType = convert(fileType);
    return true;
}
