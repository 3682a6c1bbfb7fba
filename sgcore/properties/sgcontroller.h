#pragma once

#include <QString>

class SgNumericProperty;

// A controller on a numeric property: it turns the property's value into the value that
// readers see. A property's controllers run in list order each time its value is read, each
// given the value produced by the one before (the first gets the raw value).
// Controllers are owned by the property they are inserted into.
class SgController {
public:
    SgController() = default;
    SgController(const SgController &) = delete;
    SgController &operator=(const SgController &) = delete;
    virtual ~SgController() = default;

    // The controlled value, from the value so far and the property that owns the controller.
    virtual float evaluate(float value, const SgNumericProperty &channel) const = 0;
    // The property this controller reads, if any (null for controllers that link to none).
    virtual SgNumericProperty *getLinkProperty() const { return nullptr; }
    // A short type text for display ("ERC[DeltaAdd]", ...).
    virtual QString getTypeName() const { return QString(); }
};
