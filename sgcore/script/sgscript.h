#pragma once

#include <QString>

// A host script: a JavaScript text run in the host's JavaScript engine (QJSEngine) with the
// scene reachable through the global object `scene` (see sgscriptsceneapi.h). Pose files are
// such scripts: they set bone rotations and morph or property values, so that the figure takes
// a pose before a morph target sculpted on that pose is loaded. examples/poses/ documents the
// format with an example.
//
// Only the two text extensions are read; the binary and encrypted forms are recognised as
// script files (`isScriptFile`) but refused by `loadFromFile` with a clear error, since this
// host has no compiled script format.
class SgScript {
public:
    // File extensions (without the dot) of the host's script forms.
    static const QString s_VarnScriptBinaryExtension;          // "sgb": compiled script
    static const QString s_VarnScriptEncryptedBinaryExtension; // "sge": encrypted compiled script
    static const QString s_VarnScript1TextExtension;           // "sgs": script text
    static const QString s_VarnScript2TextExtension;           // "js": JavaScript text

    SgScript();
    ~SgScript();

    // Reads the script at `path` (UTF-8 text, at most 16 MiB). With `checkSyntax` the text is
    // also parsed, and a syntax error fails the load. False, with `errorString()` set, for a
    // missing or unreadable file, a file that is too big, a binary or encrypted script, or a
    // syntax error; the previous script is then cleared. O(file size).
    bool loadFromFile(const QString &path, bool checkSyntax);

    // Sets the script text directly (`origin` names it in messages).
    void setSource(const QString &source, const QString &origin = QString());

    // Runs the loaded script in a fresh engine with the `scene` object over the application's
    // scene and a `print` function that writes to the host log. False when nothing is loaded
    // or the script throws; the error, with its line, goes to `errorString()` and the host log.
    bool execute();

    QString source() const { return m_source; }
    QString fileName() const { return m_fileName; }
    QString errorString() const { return m_error; }

    // True when `path` names a file of one of the four script extensions (case-insensitive).
    // Does not touch the file system.
    static bool isScriptFile(const QString &path);

private:
    QString m_source;
    QString m_fileName;
    QString m_error;
    bool m_loaded = false;
};
