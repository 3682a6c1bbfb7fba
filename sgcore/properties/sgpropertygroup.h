#pragma once

#include <QString>

#include <memory>
#include <vector>

class SgProperty;
class SgPropertyGroupTree;

// One group of an element's property group tree: a path segment with child groups. The
// group's properties are the owner's properties whose path equals the group's path.
class SgPropertyGroup {
public:
    SgPropertyGroup(SgPropertyGroupTree *tree, SgPropertyGroup *parent, const QString &name);
    ~SgPropertyGroup();
    SgPropertyGroup(const SgPropertyGroup &) = delete;
    SgPropertyGroup &operator=(const SgPropertyGroup &) = delete;

    // The segment name ("Face" for "Morphs/Face").
    QString getName() const { return m_name; }
    // The full path from the top of the tree, segments joined by "/".
    QString getPath() const;
    SgPropertyGroup *getParent() const { return m_parent; }
    // The first child group and the next group on the same level (adding order), or null.
    SgPropertyGroup *getFirstChild() const;
    SgPropertyGroup *getNextSibling() const;
    int getChildCount() const { return static_cast<int>(m_children.size()); }
    SgPropertyGroup *getChild(int index) const;
    // The child named `name`, or null.
    SgPropertyGroup *findChild(const QString &name) const;
    // The child named `name`, created (appended) when missing.
    SgPropertyGroup *addChild(const QString &name);
    // The owner's properties whose path equals this group's path, in the owner's order.
    // O(owner's properties).
    std::vector<SgProperty *> getProperties() const;

private:
    SgPropertyGroupTree *m_tree;
    SgPropertyGroup *m_parent;
    QString m_name;
    std::vector<std::unique_ptr<SgPropertyGroup>> m_children;
};
