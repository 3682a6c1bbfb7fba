#include "sgcore/widgets/sgfileiopresetwidget.h"

#include "sgcore/app/sgappsettings.h"
#include "sgcore/importer/sgfileiosettings.h"
#include "sgcore/importer/sggeometryimporter.h"

#include <QCheckBox>
#include <QComboBox>
#include <QDoubleSpinBox>
#include <QFormLayout>
#include <QHBoxLayout>

namespace {
const QStringList &axisNames() {
    static const QStringList names{QStringLiteral("X"), QStringLiteral("Y"), QStringLiteral("Z")};
    return names;
}
const QString &axisKey(int i) {
    static const QString *keys[3] = {&SgGeometryImporter::s_LatAxisKey,
                                     &SgGeometryImporter::s_VertAxisKey,
                                     &SgGeometryImporter::s_DepthAxisKey};
    return *keys[i];
}
const QString &invertKey(int i) {
    static const QString *keys[3] = {&SgGeometryImporter::s_InvertLatAxisKey,
                                     &SgGeometryImporter::s_InvertVertAxisKey,
                                     &SgGeometryImporter::s_InvertDepthAxisKey};
    return *keys[i];
}
} // namespace

SgFileIOPresetWidget::SgFileIOPresetWidget(QWidget *parent, Conversion conversion,
                                           const QString &settingsName)
    : QWidget(parent), m_conversion(conversion), m_settingsName(settingsName) {
    setObjectName(settingsName);
    auto *form = new QFormLayout(this);
    form->setContentsMargins(0, 0, 0, 0);
    m_preset = new QComboBox(this);
    m_preset->setObjectName(QStringLiteral("SgFileIOPreset"));
    m_preset->addItems({tr("Default"), tr("Custom")});
    form->addRow(tr("Preset:"), m_preset);
    const QString labels[3] = {tr("Lateral Axis:"), tr("Vertical Axis:"), tr("Depth Axis:")};
    for (int i = 0; i < 3; ++i) {
        auto *row = new QHBoxLayout;
        m_axes[i] = new QComboBox(this);
        m_axes[i]->setObjectName(QStringLiteral("SgFileIOAxis%1").arg(i));
        m_axes[i]->addItems(axisNames());
        m_invert[i] = new QCheckBox(tr("Invert"), this);
        m_invert[i]->setObjectName(QStringLiteral("SgFileIOInvert%1").arg(i));
        row->addWidget(m_axes[i]);
        row->addWidget(m_invert[i]);
        form->addRow(labels[i], row);
        connect(m_axes[i], &QComboBox::currentIndexChanged, this,
                &SgFileIOPresetWidget::fieldEdited);
        connect(m_invert[i], &QCheckBox::toggled, this, &SgFileIOPresetWidget::fieldEdited);
    }
    m_scale = new QDoubleSpinBox(this);
    m_scale->setObjectName(QStringLiteral("SgFileIOScale"));
    m_scale->setDecimals(4);
    m_scale->setRange(0.0001, 100000.0);
    form->addRow(tr("Scale:"), m_scale);
    connect(m_scale, &QDoubleSpinBox::valueChanged, this, &SgFileIOPresetWidget::fieldEdited);
    connect(m_preset, &QComboBox::currentIndexChanged, this, [this](int index) {
        if (index == 0)
            setDefaults();
        else
            restoreCustom();
    });
    setDefaults();
}

SgFileIOPresetWidget::~SgFileIOPresetWidget() = default;

QString SgFileIOPresetWidget::presetName() const {
    return m_preset->currentIndex() == 0 ? QStringLiteral("Default") : QStringLiteral("Custom");
}

bool SgFileIOPresetWidget::setPreset(const QString &name) {
    const int index = name == QLatin1String("Default")  ? 0
                      : name == QLatin1String("Custom") ? 1
                                                        : -1;
    if (index < 0)
        return false;
    m_preset->setCurrentIndex(index);
    return true;
}

void SgFileIOPresetWidget::getAllSettings(SgFileIOSettings &options, bool save) const {
    for (int i = 0; i < 3; ++i) {
        options.setValue(axisKey(i), m_axes[i]->currentText());
        options.setValue(invertKey(i), m_invert[i]->isChecked());
    }
    options.setValue(SgGeometryImporter::s_ScaleKey, m_scale->value());
    options.setValue(SgGeometryImporter::s_PresetKey, presetName());
    if (save && m_preset->currentIndex() == 1)
        SgAppSettings(m_settingsName).setString(QStringLiteral("Custom"), options.toString());
}

void SgFileIOPresetWidget::setDefaults() {
    m_updating = true;
    for (int i = 0; i < 3; ++i) {
        m_axes[i]->setCurrentIndex(i);
        m_invert[i]->setChecked(false);
    }
    m_scale->setValue(1.0);
    m_updating = false;
}

// The custom values kept by an earlier `getAllSettings(options, true)`, or the shown ones.
void SgFileIOPresetWidget::restoreCustom() {
    SgFileIOSettings saved;
    if (!saved.fromString(SgAppSettings(m_settingsName).getString(QStringLiteral("Custom"))))
        return;
    m_updating = true;
    for (int i = 0; i < 3; ++i) {
        const int axis = axisNames().indexOf(saved.stringValue(axisKey(i), axisNames()[i]));
        m_axes[i]->setCurrentIndex(axis < 0 ? i : axis);
        m_invert[i]->setChecked(saved.boolValue(invertKey(i), false));
    }
    m_scale->setValue(saved.doubleValue(SgGeometryImporter::s_ScaleKey, 1.0));
    m_updating = false;
}

void SgFileIOPresetWidget::fieldEdited() {
    if (!m_updating && m_preset->currentIndex() == 0) {
        QSignalBlocker block(m_preset);
        m_preset->setCurrentIndex(1);
    }
}
