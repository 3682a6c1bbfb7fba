#include "facetor/sgfacetoredit.h"

namespace {

bool parseNumbers(const QString &text, int count, QList<float> &numbers) {
    const QStringList parts = text.split(QLatin1Char(','));
    if (parts.size() != count)
        return false;
    for (const QString &part : parts) {
        bool ok = false;
        numbers.append(part.trimmed().toFloat(&ok));
        if (!ok)
            return false;
    }
    return true;
}

// Appends the vertex `at` and, when the node has two vertices to join it to, a triangle over
// vertices 0, 1 and the new one, so that the returned geometry has one vertex more.
void addVertex(SgExchangeNode &node, const QList<float> &at) {
    const int32_t added = node.vertexCount();
    node.vertices.insert(node.vertices.end(), at.begin(), at.end());
    if (added < 2)
        return;
    SgExchangeNode::Facet facet;
    facet.type = 'T';
    facet.firstCorner = uint32_t(node.corners.size());
    facet.cornerCount = 3;
    for (const int32_t vertex : {int32_t(0), int32_t(1), added}) {
        SgExchangeNode::Corner corner;
        corner.vertex = vertex;
        corner.uv = node.uvCount() > 0 ? 0 : -1;
        node.corners.push_back(corner);
    }
    node.facets.push_back(facet);
}

} // namespace

bool SgFacetorEdit::parse(const QString &script, QString &error) {
    m_steps.clear();
    for (const QString &raw : script.split(QLatin1Char(';'), Qt::SkipEmptyParts)) {
        const QString step = raw.trimmed();
        const qsizetype equals = step.indexOf(QLatin1Char('='));
        Step parsed;
        parsed.kind = step.left(equals).trimmed();
        const QString argument = equals < 0 ? QString() : step.mid(equals + 1);
        bool ok = equals > 0;
        if (ok && parsed.kind == QLatin1String("move"))
            ok = parseNumbers(argument, 3, parsed.numbers);
        else if (ok && parsed.kind == QLatin1String("scale"))
            ok = parseNumbers(argument, 1, parsed.numbers);
        else if (ok && parsed.kind == QLatin1String("vertex"))
            ok = parseNumbers(argument, 4, parsed.numbers);
        else if (ok && parsed.kind == QLatin1String("extra"))
            ok = parseNumbers(argument, 3, parsed.numbers);
        else if (ok && parsed.kind == QLatin1String("diffuse"))
            ok = parseNumbers(argument, 3, parsed.numbers);
        else if (ok && parsed.kind == QLatin1String("name"))
            parsed.text = argument;
        else
            ok = false;
        if (!ok) {
            error = QStringLiteral("Cannot understand the edit step \"%1\".").arg(step);
            m_steps.clear();
            return false;
        }
        m_steps.append(parsed);
    }
    return true;
}

void SgFacetorEdit::apply(SgExchangeNode &node) const {
    for (const Step &step : m_steps) {
        if (step.kind == QLatin1String("move")) {
            for (size_t i = 0; i < node.vertices.size(); ++i)
                node.vertices[i] += step.numbers[int(i % 3)];
        } else if (step.kind == QLatin1String("scale")) {
            for (float &value : node.vertices)
                value *= step.numbers[0];
        } else if (step.kind == QLatin1String("vertex")) {
            const auto index = int64_t(step.numbers[0]);
            if (index >= 0 && index < node.vertexCount())
                for (int axis = 0; axis < 3; ++axis)
                    node.vertices[size_t(index) * 3 + size_t(axis)] += step.numbers[axis + 1];
        } else if (step.kind == QLatin1String("extra")) {
            addVertex(node, step.numbers);
        } else if (step.kind == QLatin1String("name")) {
            node.name = step.text;
        } else if (step.kind == QLatin1String("diffuse")) {
            for (SgExchangeNode::Material &material : node.materials)
                for (int c = 0; c < 3; ++c)
                    material.diffuse[c] = step.numbers[c];
        }
    }
}
