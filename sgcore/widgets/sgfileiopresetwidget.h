#pragma once

#include <QGroupBox>
#include <QWidget>

class QCheckBox;
class QComboBox;
class QDoubleSpinBox;
class SgFileIOSettings;

// The host's geometry conversion picker of import and export dialogs: a preset box ("Default"
// keeps the file's axes at scale 1; "Custom" is any other combination) above the three axis
// boxes, their inversion check boxes and the scale. Editing a field switches the preset to
// "Custom"; choosing "Default" puts the fields back to the defaults.
class SgFileIOPresetWidget : public QWidget {
    Q_OBJECT
public:
    enum Conversion { ImportConversion = 0, ExportConversion = 1 };

    // `settingsName` becomes the object name and names the settings group of the widget.
    SgFileIOPresetWidget(QWidget *parent, Conversion conversion, const QString &settingsName);
    ~SgFileIOPresetWidget() override;

    Conversion conversion() const { return m_conversion; }
    // The chosen preset's name ("Default" or "Custom").
    QString presetName() const;
    // Chooses the preset `name`; an unknown name changes nothing and returns false.
    bool setPreset(const QString &name);

    // Fills `options` with the shown conversion (the geometry importer's option keys "LatAxis",
    // "VertAxis", "DepthAxis", the three "Invert..." keys, "Scale" and "Preset"). With `save`
    // the custom values are also kept in the application settings for the next widget.
    void getAllSettings(SgFileIOSettings &options, bool save) const;

private:
    void setDefaults();
    void fieldEdited();
    void restoreCustom();

    Conversion m_conversion;
    QString m_settingsName;
    QComboBox *m_preset = nullptr;
    QComboBox *m_axes[3] = {};
    QCheckBox *m_invert[3] = {};
    QDoubleSpinBox *m_scale = nullptr;
    bool m_updating = false;
};
