#pragma once

#include <QString>

#include <memory>

class QSettings;

// The modeler's settings file, so that a modeler the host starts with "-sgl" alone can be set
// up without environment variables: "Facetor/Facetor.ini" in the user's configuration folder
// ($XDG_CONFIG_HOME, else ~/.config), in INI format. Keys of the [General] group:
//   workspace    folder for received nodes
//   watch        true: return a workspace OBJ file whenever it is saved
//   settleTime   milliseconds a saved file must stay unchanged before it is returned
//   edit         a scripted edit applied to every received node, which is returned at once
//   hostTimeout  milliseconds of silence after which the host counts as gone (0: never)
//   linkTimeout  milliseconds to wait for the host to set the link up
//   log          file that receives the modeler's log (default: standard error)
// A command-line option overrides the environment variable, which overrides the file.
class SgFacetorSettings {
public:
    SgFacetorSettings();
    ~SgFacetorSettings();
    SgFacetorSettings(const SgFacetorSettings &) = delete;
    SgFacetorSettings &operator=(const SgFacetorSettings &) = delete;

    // The settings file's path (it need not exist).
    QString fileName() const;
    // The text of `key` ("" when absent).
    QString value(const char *key) const;

private:
    std::unique_ptr<QSettings> m_settings;
};
