#pragma once

#include <QCoreApplication>
#include <QString>

// Appends the range lines of the Create Property dialog's validation for a numeric type: min
// above max always; value and default outside the range only when the limits are obeyed. Equal
// values pass. False when a line was appended.
template <typename T>
bool sgCheckPropertyRange(T min, T max, T value, T defaultValue, bool obeyLimits,
                          QString &message) {
    const auto tr = [](const char *text) {
        return QCoreApplication::translate("SgCreatePropertyDlg", text);
    };
    bool valid = true;
    if (max < min) {
        message += tr("   - Min is greater than Max\n");
        valid = false;
    }
    if (obeyLimits) {
        if (value < min || value > max) {
            message += tr("   - Value is not within limits\n");
            valid = false;
        }
        if (defaultValue < min || defaultValue > max) {
            message += tr("   - Default Value is not within limits\n");
            valid = false;
        }
    }
    return valid;
}
