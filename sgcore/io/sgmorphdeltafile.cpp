#include "sgcore/io/sgmorphdeltafile.h"

#include "sgcore/io/sgfileio.h"
#include "sgcore/morph/sgmorphdeltas.h"

#include <QByteArray>
#include <QFile>

#include <charconv>
#include <memory>
#include <string_view>

namespace {

void appendNumber(QByteArray &out, auto value) {
    char buffer[32];
    const auto result = std::to_chars(buffer, buffer + sizeof buffer, value);
    out.append(buffer, result.ptr - buffer);
}

// Reads the space-separated numbers of one line into `values`; false when a field is not a
// number of that type, or the count differs.
template <typename T> bool parseFields(std::string_view line, T *values, int count) {
    int n = 0;
    size_t at = 0;
    while (at < line.size()) {
        while (at < line.size() && (line[at] == ' ' || line[at] == '\t' || line[at] == '\r'))
            ++at;
        if (at == line.size())
            break;
        if (n == count)
            return false;
        const auto result = std::from_chars(line.data() + at, line.data() + line.size(), values[n]);
        if (result.ec != std::errc())
            return false;
        at = size_t(result.ptr - line.data());
        if (at < line.size() && line[at] != ' ' && line[at] != '\t' && line[at] != '\r')
            return false;
        ++n;
    }
    return n == count;
}

} // namespace

bool SgMorphDeltaFile::write(const QString &path, const SgMorphDeltas &deltas, QString &error) {
    QByteArray text;
    text.reserve(qsizetype(deltas.getNumEntries()) * 40 + 32);
    text += "deltas ";
    appendNumber(text, deltas.getVertCount());
    text += '\n';
    for (int i = 0; i < deltas.getNumEntries(); ++i) {
        const SgVec3 &d = deltas.getDelta(i);
        appendNumber(text, deltas.getVertex(i));
        for (float c : {d.x, d.y, d.z}) {
            text += ' ';
            appendNumber(text, c);
        }
        text += '\n';
    }
    return SgFileIO::writeWholeFile(path, text, &error);
}

SgMorphDeltas *SgMorphDeltaFile::read(const QString &path, int vertexCount, QString &error) {
    QFile file(path);
    if (!file.open(QIODevice::ReadOnly)) {
        error = QStringLiteral("%1: cannot open the file (%2)").arg(path, file.errorString());
        return nullptr;
    }
    return readBuffer(file.readAll(), vertexCount, path, error);
}

SgMorphDeltas *SgMorphDeltaFile::readBuffer(const QByteArray &bytes, int vertexCount,
                                            const QString &sourceName, QString &error) {
    const std::string_view text(bytes.constData(), size_t(bytes.size()));
    auto result = std::make_unique<SgMorphDeltas>();
    result->setVertCount(vertexCount);
    bool header = false;
    int last = -1;
    int lineNumber = 0;
    auto fail = [&](const QString &what) {
        error = QStringLiteral("%1:%2: %3").arg(sourceName).arg(lineNumber).arg(what);
        return nullptr;
    };
    for (size_t at = 0; at < text.size();) {
        const size_t end = std::min(text.find('\n', at), text.size());
        const std::string_view line = text.substr(at, end - at);
        at = end + 1;
        ++lineNumber;
        if (line.empty() || line == "\r" || line.front() == '#')
            continue;
        if (!header) {
            int count = -1;
            if (!line.starts_with("deltas ") || !parseFields(line.substr(7), &count, 1))
                return fail(QStringLiteral("the file must start with \"deltas <vertex count>\""));
            if (count != vertexCount)
                return fail(QStringLiteral("the deltas are for %1 vertices, the geometry has %2")
                                .arg(count)
                                .arg(vertexCount));
            header = true;
            continue;
        }
        const size_t space = line.find_first_of(" \t");
        int vertex = -1;
        float d[3];
        if (space == std::string_view::npos || !parseFields(line.substr(0, space), &vertex, 1) ||
            !parseFields(line.substr(space), d, 3))
            return fail(QStringLiteral("expected \"<vertex> <dx> <dy> <dz>\""));
        if (vertex <= last || vertex >= vertexCount)
            return fail(QStringLiteral("vertex %1 must be above %2 and below %3")
                            .arg(vertex)
                            .arg(last)
                            .arg(vertexCount));
        last = vertex;
        result->addDelta(vertex, SgVec3(d[0], d[1], d[2]), false);
    }
    if (!header)
        return fail(QStringLiteral("the file is empty"));
    return result.release();
}
