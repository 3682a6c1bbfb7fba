#pragma once

#include "sgcore/scene/sgbase.h"

#include <memory>

class SgElement;
class SgPropertySettings;
class SgTexture;

// Base of all properties: name (unique on its owner), label, group path, owner element and
// the flags the property dialogs edit. Colour and float properties can be mapped to an image.
class SgProperty : public SgBase {
public:
    SgProperty();
    explicit SgProperty(const QString &name);
    ~SgProperty() override;
    SgProperty(const SgProperty &) = delete;
    SgProperty &operator=(const SgProperty &) = delete;

    // Records the property's attributes into `settings` (keys: see SgPropertySettings). The
    // settings classes implement these (sgcore/settings/sgpropertyattributes.cpp).
    virtual void getAttributes(SgPropertySettings &settings) const;
    // Applies the attributes present in `settings`; absent or mistyped ones are left unchanged.
    virtual void setAttributes(const SgPropertySettings &settings);

    // The label shown to the user; the name while no label has been set.
    QString getLabel() const { return m_label.isNull() ? getName() : m_label; }
    void setLabel(const QString &label) { m_label = label; }
    // The group path, segments separated by "/" ("Morphs/Face"); empty for none.
    QString getPath() const { return m_path; }
    void setPath(const QString &path) { m_path = path; }

    // The element that owns the property (set by SgElement::addProperty), or null.
    SgElement *getOwner() const { return m_owner; }
    void setOwner(SgElement *owner) { m_owner = owner; }

    bool isHidden() const { return m_hidden; }
    void setHidden(bool hidden) { m_hidden = hidden; }
    bool isLocked() const { return m_locked; }
    void lock(bool locked = true) { m_locked = locked; }
    bool canAnimate() const { return m_canAnimate; }
    void setCanAnimate(bool canAnimate) { m_canAnimate = canAnimate; }
    bool isUserProperty() const { return m_userProperty; }
    void setIsUserProperty(bool user) { m_userProperty = user; }

    // Image mapping (used by colour and float properties of materials). `isMapped` is the
    // mapped flag; the image is separate and may be null while mapped.
    bool isMapped() const { return m_mapped; }
    void setMapped(bool mapped) { m_mapped = mapped; }
    SgTexture *getMapValue() const { return m_map; }
    // Sets the image (not owned: textures belong to the image manager) and marks the property
    // mapped when `texture` is not null.
    void setMapValue(SgTexture *texture);

    // A token that expires when the property is destroyed: holders of a weak pointer to it
    // (controllers linking to this property) can tell whether the property still exists.
    std::weak_ptr<const void> getLifeToken() const { return m_life; }

private:
    QString m_label;
    QString m_path;
    SgElement *m_owner = nullptr;
    SgTexture *m_map = nullptr;
    std::shared_ptr<const void> m_life;
    bool m_hidden = false;
    bool m_locked = false;
    bool m_canAnimate = true;
    bool m_userProperty = false;
    bool m_mapped = false;
};
