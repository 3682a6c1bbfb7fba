// The properties' attribute sets: what `getAttributes` records and `setAttributes` applies for
// each property class. Kept beside the settings classes that carry them.
#include "sgcore/properties/sgnumericnodeproperty.h"
#include "sgcore/properties/sgnumericproperty.h"
#include "sgcore/properties/sgproperty.h"
#include "sgcore/settings/sgpropertysettings.h"

#include <cmath>
#include <type_traits>

namespace {

using Keys = SgPropertySettings;

// Applies the value of `key` when it is present and of the attribute's type (a float attribute
// also takes a finite double or an int); values of another type are ignored, so that a damaged
// file cannot turn text into numbers.
template <typename T, typename Apply>
void applyIfPresent(const SgPropertySettings &settings, const char *key, Apply apply) {
    const QVariant value = settings.value(QString::fromLatin1(key));
    const int type = value.typeId();
    if constexpr (std::is_same_v<T, QString>) {
        if (type == QMetaType::QString)
            apply(value.toString());
    } else if constexpr (std::is_same_v<T, bool>) {
        if (type == QMetaType::Bool)
            apply(value.toBool());
    } else {
        static_assert(std::is_same_v<T, float>);
        if (type == QMetaType::Float || type == QMetaType::Double || type == QMetaType::Int) {
            const double number = value.toDouble();
            if (std::isfinite(number) && std::isfinite(float(number)))
                apply(float(number));
        }
    }
}

void record(SgPropertySettings &settings, const char *key, const QVariant &value) {
    settings.setValue(QString::fromLatin1(key), value);
}

} // namespace

void SgProperty::getAttributes(SgPropertySettings &settings) const {
    record(settings, Keys::Name, getName());
    record(settings, Keys::Label, getLabel());
    record(settings, Keys::Path, getPath());
    record(settings, Keys::Hidden, isHidden());
    record(settings, Keys::Locked, isLocked());
    record(settings, Keys::CanAnimate, canAnimate());
    record(settings, Keys::UserProperty, isUserProperty());
}

void SgProperty::setAttributes(const SgPropertySettings &settings) {
    applyIfPresent<QString>(settings, Keys::Name, [this](const QString &v) { setName(v); });
    applyIfPresent<QString>(settings, Keys::Label, [this](const QString &v) { setLabel(v); });
    applyIfPresent<QString>(settings, Keys::Path, [this](const QString &v) { setPath(v); });
    applyIfPresent<bool>(settings, Keys::Hidden, [this](bool v) { setHidden(v); });
    applyIfPresent<bool>(settings, Keys::Locked, [this](bool v) { lock(v); });
    applyIfPresent<bool>(settings, Keys::CanAnimate, [this](bool v) { setCanAnimate(v); });
    applyIfPresent<bool>(settings, Keys::UserProperty, [this](bool v) { setIsUserProperty(v); });
}

void SgNumericProperty::getAttributes(SgPropertySettings &settings) const {
    SgProperty::getAttributes(settings);
    record(settings, Keys::Value, getRawValue());
    record(settings, Keys::DefaultValue, getDefaultValue());
    record(settings, Keys::Min, getMin());
    record(settings, Keys::Max, getMax());
    record(settings, Keys::Clamped, isClamped());
    record(settings, Keys::Sensitivity, getSensitivity());
    record(settings, Keys::DisplayAsPercent, getDisplayAsPercent());
}

void SgNumericProperty::setAttributes(const SgPropertySettings &settings) {
    SgProperty::setAttributes(settings);
    applyIfPresent<float>(settings, Keys::Value, [this](float v) { setValue(v); });
    applyIfPresent<float>(settings, Keys::DefaultValue, [this](float v) { setDefaultValue(v); });
    applyIfPresent<float>(settings, Keys::Min, [this](float v) { setMin(v); });
    applyIfPresent<float>(settings, Keys::Max, [this](float v) { setMax(v); });
    applyIfPresent<bool>(settings, Keys::Clamped, [this](bool v) { setIsClamped(v); });
    applyIfPresent<float>(settings, Keys::Sensitivity, [this](float v) { setSensitivity(v); });
    applyIfPresent<bool>(settings, Keys::DisplayAsPercent,
                         [this](bool v) { setDisplayAsPercent(v); });
}

void SgNumericNodeProperty::getAttributes(SgPropertySettings &settings) const {
    SgNumericProperty::getAttributes(settings);
    record(settings, Keys::MustHaveNode, getMustHaveNode());
}

void SgNumericNodeProperty::setAttributes(const SgPropertySettings &settings) {
    SgNumericProperty::setAttributes(settings);
    applyIfPresent<bool>(settings, Keys::MustHaveNode, [this](bool v) { setMustHaveNode(v); });
}
