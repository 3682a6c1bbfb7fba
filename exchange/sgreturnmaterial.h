#pragma once

#include <QString>

// One material as the modeler returns it: colours with channels from 0 to 1, strengths, and
// image paths (empty for none). The glossiness and opacity are the real values; the record
// carries them inverted (1 - value).
struct SgReturnMaterial {
    QString name;
    float diffuse[3] = {0.0f, 0.0f, 0.0f};
    QString diffuseImage;
    float specular[3] = {0.0f, 0.0f, 0.0f};
    float glossiness = 0.0f;
    float opacity = 1.0f;
    float bumpStrength = 0.0f;
    QString bumpImage;
};
