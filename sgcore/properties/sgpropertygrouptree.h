#pragma once

#include "sgcore/properties/sgpropertygroup.h"

#include <QStringList>

class SgElement;

// The property groups of one element, built from the paths of its properties (see
// SgElement::getPropertyGroups) and from groups added explicitly. Paths are split at "/";
// empty segments are ignored. Groups are kept once made.
class SgPropertyGroupTree {
public:
    explicit SgPropertyGroupTree(SgElement *owner);
    ~SgPropertyGroupTree();
    SgPropertyGroupTree(const SgPropertyGroupTree &) = delete;
    SgPropertyGroupTree &operator=(const SgPropertyGroupTree &) = delete;

    SgElement *getOwner() const { return m_owner; }
    // The first top-level group, or null for an empty tree.
    SgPropertyGroup *getFirstChild() const { return m_root->getFirstChild(); }
    // The invisible root above the top-level groups (name and path empty).
    SgPropertyGroup *getRoot() const { return m_root.get(); }
    // Every group's path, depth first (a group before its children, siblings in adding order).
    QStringList getAllPaths() const;
    // The group at `path`, or null.
    SgPropertyGroup *findGroup(const QString &path) const;
    // The group at `path`, created with its missing ancestors; null for an empty path.
    SgPropertyGroup *addGroup(const QString &path);

    // Splits a path into its non-empty segments.
    static QStringList splitPath(const QString &path);

private:
    SgElement *m_owner;
    std::unique_ptr<SgPropertyGroup> m_root;
};
