#pragma once

#include <QList>
#include <QString>

#include <cstdint>
#include <vector>

// One node record as the host sends it to the modeler, decoded into plain values. Coordinates
// stay in the modeler's units (the host's times 0.1), as they travel.
struct SgExchangeNode {
    struct Material {
        QString name;
        float diffuse[3] = {0, 0, 0};
        QString diffuseImageFolder;
        QString diffuseImageCopy;
        float specular[3] = {0, 0, 0};
        float invertedGlossiness = 0;
        float opacity = 0;
        float bumpStrength = 0;
        QString bumpImageFolder;
        QString bumpImageCopy;
    };
    // One facet corner: vertex index, UV index, and the host's third index.
    struct Corner {
        int32_t vertex = 0;
        int32_t uv = 0;
        int32_t third = 0;
    };
    struct Facet {
        char type = 'T'; // 'T', 'Q' or 'P'
        uint32_t material = 0;
        uint32_t firstCorner = 0; // index into corners
        uint32_t cornerCount = 0;
    };

    QString name;
    std::vector<float> vertices; // x, y, z per vertex
    std::vector<float> uvs;      // u, v per UV
    QList<Material> materials;
    std::vector<Facet> facets;
    std::vector<Corner> corners;
    QString trailer;

    int vertexCount() const { return int(vertices.size() / 3); }
    int uvCount() const { return int(uvs.size() / 2); }
};
