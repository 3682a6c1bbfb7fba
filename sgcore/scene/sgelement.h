#pragma once

#include "sgcore/scene/sgbase.h"
#include "sgcore/scene/sgresult.h"

#include <memory>
#include <vector>

class SgProperty;
class SgPropertyGroupTree;

// A named element of the scene that carries properties: nodes, objects, shapes, modifiers and
// materials. It owns its properties; property names are unique on one element.
class SgElement : public SgBase {
public:
    SgElement();
    explicit SgElement(const QString &name);
    ~SgElement() override;
    SgElement(const SgElement &) = delete;
    SgElement &operator=(const SgElement &) = delete;

    // The label shown to the user; the name while no label has been set.
    QString getLabel() const { return m_label.isNull() ? getName() : m_label; }
    void setLabel(const QString &label) { m_label = label; }

    // The element this one belongs to (an object for a modifier or shape; none for a node).
    SgElement *getElementParent() const { return m_elementParent; }
    void setElementParent(SgElement *parent) { m_elementParent = parent; }

    // Adds `property` and takes ownership: SgResult::Ok (0); SgResult::NameExists (82) when a
    // property of that name exists (the property is not taken); SgResult::Failed for null or a
    // property that already has an owner. O(properties).
    int addProperty(SgProperty *property);
    // The property named `name` (exact), or null. O(properties).
    SgProperty *findProperty(const QString &name) const;
    // Removes and deletes the property named `name`: 0, or SgResult::Failed when there is none.
    int removeProperty(const QString &name);
    // Removes `property` without deleting it and hands it to the caller (its owner becomes
    // null); null when it is not one of this element's properties.
    SgProperty *takeProperty(SgProperty *property);
    int getPropertyCount() const { return static_cast<int>(m_properties.size()); }
    // The property at `index` in adding order; null outside the list.
    SgProperty *getProperty(int index) const;
    const std::vector<SgProperty *> &getProperties() const { return m_properties; }

    // The property group tree of this element (never null): one group per path segment of the
    // properties' paths ("Morphs/Face" gives "Morphs" with child "Face"), plus groups added
    // with SgPropertyGroupTree::addGroup. Brought up to date on each call; groups are never
    // dropped, so pointers into the tree stay valid while the element lives.
    SgPropertyGroupTree *getPropertyGroups();

private:
    QString m_label;
    SgElement *m_elementParent = nullptr;
    std::vector<SgProperty *> m_properties;
    std::unique_ptr<SgPropertyGroupTree> m_groups;
};
