#include "facetor/sgfacetorsettings.h"

#include <QSettings>

SgFacetorSettings::SgFacetorSettings()
    : m_settings(std::make_unique<QSettings>(QSettings::IniFormat, QSettings::UserScope,
                                             QStringLiteral("Facetor"),
                                             QStringLiteral("Facetor"))) {}

SgFacetorSettings::~SgFacetorSettings() = default;

QString SgFacetorSettings::fileName() const {
    return m_settings->fileName();
}

QString SgFacetorSettings::value(const char *key) const {
    // An unquoted INI value with commas reads as a list ("edit=move=1,0,0"): join it again.
    const QVariant value = m_settings->value(QLatin1String(key));
    if (value.typeId() == QMetaType::QStringList)
        return value.toStringList().join(QLatin1Char(','));
    return value.toString();
}
