#include "sgcore/properties/sgpropertygroup.h"

#include "sgcore/properties/sgproperty.h"
#include "sgcore/properties/sgpropertygrouptree.h"
#include "sgcore/scene/sgelement.h"

SgPropertyGroup::SgPropertyGroup(SgPropertyGroupTree *tree, SgPropertyGroup *parent,
                                 const QString &name)
    : m_tree(tree), m_parent(parent), m_name(name) {}

SgPropertyGroup::~SgPropertyGroup() = default;

QString SgPropertyGroup::getPath() const {
    if (!m_parent) {
        return QString();
    }
    const QString above = m_parent->getPath();
    return above.isEmpty() ? m_name : above + QLatin1Char('/') + m_name;
}

SgPropertyGroup *SgPropertyGroup::getFirstChild() const {
    return m_children.empty() ? nullptr : m_children.front().get();
}

SgPropertyGroup *SgPropertyGroup::getNextSibling() const {
    if (!m_parent) {
        return nullptr;
    }
    const auto &sibs = m_parent->m_children;
    for (size_t i = 0; i + 1 < sibs.size(); ++i) {
        if (sibs[i].get() == this) {
            return sibs[i + 1].get();
        }
    }
    return nullptr;
}

SgPropertyGroup *SgPropertyGroup::getChild(int index) const {
    return index >= 0 && index < getChildCount() ? m_children[size_t(index)].get() : nullptr;
}

SgPropertyGroup *SgPropertyGroup::findChild(const QString &name) const {
    for (const auto &c : m_children) {
        if (c->m_name == name) {
            return c.get();
        }
    }
    return nullptr;
}

SgPropertyGroup *SgPropertyGroup::addChild(const QString &name) {
    if (SgPropertyGroup *found = findChild(name)) {
        return found;
    }
    m_children.push_back(std::make_unique<SgPropertyGroup>(m_tree, this, name));
    return m_children.back().get();
}

std::vector<SgProperty *> SgPropertyGroup::getProperties() const {
    std::vector<SgProperty *> out;
    if (!m_tree || !m_tree->getOwner() || !m_parent) {
        return out;
    }
    const QStringList mine = SgPropertyGroupTree::splitPath(getPath());
    for (SgProperty *p : m_tree->getOwner()->getProperties()) {
        if (SgPropertyGroupTree::splitPath(p->getPath()) == mine) {
            out.push_back(p);
        }
    }
    return out;
}

SgPropertyGroupTree::SgPropertyGroupTree(SgElement *owner)
    : m_owner(owner), m_root(std::make_unique<SgPropertyGroup>(this, nullptr, QString())) {}

SgPropertyGroupTree::~SgPropertyGroupTree() = default;

QStringList SgPropertyGroupTree::splitPath(const QString &path) {
    return path.split(QLatin1Char('/'), Qt::SkipEmptyParts);
}

namespace {
void collectPaths(const SgPropertyGroup *group, QStringList &out) {
    for (const SgPropertyGroup *c = group->getFirstChild(); c; c = c->getNextSibling()) {
        out.append(c->getPath());
        collectPaths(c, out);
    }
}
} // namespace

QStringList SgPropertyGroupTree::getAllPaths() const {
    QStringList out;
    collectPaths(m_root.get(), out);
    return out;
}

SgPropertyGroup *SgPropertyGroupTree::findGroup(const QString &path) const {
    const QStringList parts = splitPath(path);
    if (parts.isEmpty()) {
        return nullptr;
    }
    SgPropertyGroup *g = m_root.get();
    for (const QString &part : parts) {
        g = g->findChild(part);
        if (!g) {
            return nullptr;
        }
    }
    return g;
}

SgPropertyGroup *SgPropertyGroupTree::addGroup(const QString &path) {
    const QStringList parts = splitPath(path);
    if (parts.isEmpty()) {
        return nullptr;
    }
    SgPropertyGroup *g = m_root.get();
    for (const QString &part : parts) {
        g = g->addChild(part);
    }
    return g;
}
