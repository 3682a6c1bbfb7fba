#include "app/sgobjwriter.h"

#include <QSaveFile>

#include <charconv>

void SgObjWriter::comment(const QString &text) {
    m_text += "# ";
    m_text += text.toUtf8();
    m_text += '\n';
}

void SgObjWriter::object(const QString &name) {
    m_text += "o ";
    m_text += name.toUtf8();
    m_text += '\n';
}

void SgObjWriter::appendFloat(float value) {
    char buffer[32];
    const auto result = std::to_chars(buffer, buffer + sizeof buffer, value);
    m_text.append(buffer, result.ptr - buffer);
}

void SgObjWriter::appendInt(long long value) {
    char buffer[24];
    const auto result = std::to_chars(buffer, buffer + sizeof buffer, value);
    m_text.append(buffer, result.ptr - buffer);
}

void SgObjWriter::vertices(const float *xyz, std::size_t count) {
    m_text.reserve(m_text.size() + qsizetype(count) * 36);
    for (std::size_t i = 0; i < count; ++i) {
        m_text += "v ";
        appendFloat(xyz[3 * i]);
        m_text += ' ';
        appendFloat(xyz[3 * i + 1]);
        m_text += ' ';
        appendFloat(xyz[3 * i + 2]);
        m_text += '\n';
    }
}

void SgObjWriter::group(const QString &name) {
    m_text += "g ";
    m_text += name.toUtf8();
    m_text += '\n';
}

void SgObjWriter::material(const QString &name) {
    m_text += "usemtl ";
    m_text += name.toUtf8();
    m_text += '\n';
}

void SgObjWriter::face(const int *indices, std::size_t count) {
    m_text += 'f';
    for (std::size_t i = 0; i < count; ++i) {
        m_text += ' ';
        appendInt(static_cast<long long>(indices[i]) + 1);
    }
    m_text += '\n';
}

bool SgObjWriter::save(const QString &path) {
    QSaveFile file(path);
    if (!file.open(QIODevice::WriteOnly) || file.write(m_text) != m_text.size() || !file.commit()) {
        m_error = file.errorString();
        return false;
    }
    m_error.clear();
    return true;
}
