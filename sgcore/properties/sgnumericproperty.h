#pragma once

#include "sgcore/properties/sgproperty.h"

#include <vector>

class SgController;
class SgPropertySettings;

// A numeric property (float or int): raw value, default, limits with optional clamping,
// slider sensitivity, percent display, and a list of controllers evaluated when the value is
// read.
class SgNumericProperty : public SgProperty {
public:
    SgNumericProperty();
    explicit SgNumericProperty(const QString &name);
    ~SgNumericProperty() override;

    // Add the numeric attributes: raw value, default, limits, clamping, sensitivity, percent.
    void getAttributes(SgPropertySettings &settings) const override;
    void setAttributes(const SgPropertySettings &settings) override;

    // The value readers see: the raw value passed through every controller in order, then
    // clamped to [min, max] when clamping is on. A controller chain that reads this property
    // again (a link cycle) sees the raw value instead of recursing. O(controllers).
    float getValue() const;
    // The value as set, before controllers and clamping.
    float getRawValue() const { return m_value; }
    // Sets the raw value (clamping applies on reading, so the order of setters does not matter).
    void setValue(float value) { m_value = value; }
    float getDefaultValue() const { return m_default; }
    void setDefaultValue(float value) { m_default = value; }
    float getMin() const { return m_min; }
    void setMin(float min) { m_min = min; }
    float getMax() const { return m_max; }
    void setMax(float max) { m_max = max; }
    bool isClamped() const { return m_clamped; }
    void setIsClamped(bool clamped) { m_clamped = clamped; }
    float getSensitivity() const { return m_sensitivity; }
    void setSensitivity(float sensitivity) { m_sensitivity = sensitivity; }
    bool getDisplayAsPercent() const { return m_percent; }
    void setDisplayAsPercent(bool percent) { m_percent = percent; }

    // Inserts `controller` at `index` (-1 or any index past the end appends) and takes
    // ownership: 0; SgResult::Failed (1) for null or a controller already in the list.
    int insertController(SgController *controller, int index = -1);
    int getControllerCount() const { return static_cast<int>(m_controllers.size()); }
    // The controller at `index`; null outside the list.
    SgController *getController(int index) const;
    const std::vector<SgController *> &getControllers() const { return m_controllers; }
    // Removes and deletes `controller`: 0, or SgResult::Failed when it is not in the list.
    int removeController(SgController *controller);
    // Removes `controller` without deleting it and hands it to the caller; null if absent.
    SgController *takeController(SgController *controller);
    // Removes and deletes every controller.
    void removeAllControllers();
    // The property that the first linking controller reads (see SgController::getLinkProperty),
    // or null when no controller links to a property.
    SgNumericProperty *getLinkProperty() const;

private:
    float m_value = 0.0f;
    float m_default = 0.0f;
    float m_min = 0.0f;
    float m_max = 1.0f;
    float m_sensitivity = 0.01f;
    bool m_clamped = false;
    bool m_percent = false;
    mutable bool m_evaluating = false;
    std::vector<SgController *> m_controllers;
};
