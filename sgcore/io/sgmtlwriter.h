#pragma once

#include <QByteArray>
#include <QDir>
#include <QString>

#include <vector>

class SgMaterial;

// Builds a Wavefront MTL file for the host's standard materials: one "newmtl" block per
// material with its diffuse ("Kd") and specular ("Ks") colours in 0 to 1, glossiness ("Ns",
// 0 to 1000), opacity ("d"), diffuse map ("map_Kd") and bump map with its strength
// ("map_bump -bm"). Map paths are written relative to the MTL file's folder when they lie
// inside it, else absolute. A material name is written once: later namesakes are skipped.
class SgMtlWriter {
public:
    // `folder`: where the MTL file goes (for relative map paths).
    explicit SgMtlWriter(const QDir &folder) : m_folder(folder) {}

    void add(const SgMaterial *material);
    void add(const std::vector<SgMaterial *> &materials);

    int materialCount() const { return m_names.size(); }
    const QByteArray &text() const { return m_text; }

    // Writes the text to `path` (replacing the file atomically); false with `errorString` set.
    bool save(const QString &path);
    const QString &errorString() const { return m_error; }

private:
    QString mapPath(const QString &file) const;

    QDir m_folder;
    QStringList m_names;
    QByteArray m_text;
    QString m_error;
};
