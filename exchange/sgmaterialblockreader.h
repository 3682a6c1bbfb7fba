#pragma once

#include "exchange/sgreturnmaterial.h"

#include <cstddef>
#include <vector>

class SgRecordInput;
class SgShape;

// Reads the materials block of a record that the modeler returns (i32 count, then one entry of
// 42 bytes and three strings per material) and turns it into host materials. Strengths that
// are not finite numbers are dropped (the entry keeps its default).
//
// Reading and applying are separate steps so that a record found bad later leaves nothing
// behind: `read` only parses, `applyTo` creates materials and loads images.
class SgMaterialBlockReader {
public:
    // Parses the block at the cursor. Throws SgRecordError (from the cursor) when the block is
    // cut short or its count cannot fit in the bytes that remain. O(block bytes).
    void read(SgRecordInput &input);

    // The parsed materials, in record order.
    const std::vector<SgReturnMaterial> &materials() const { return m_materials; }

    // Facet material indices are 8-bit in the host's meshes: at most this many materials can
    // be told apart.
    static constexpr std::size_t kMaxMaterialIndices = 256;

    // The number of materials that facets can use: the parsed count up to 256, or 1
    // ("default") when the block was empty. A facet index at or above it stands for material 0.
    int usableMaterialCount() const;

    // Adds one SgDefaultMaterial per parsed entry to `shape` (or one named "default" when the
    // block was empty): name, diffuse colour and colour map, specular colour, glossiness,
    // opacity and bump strength. A returned bump image is ignored (the host's material
    // interface has no bump-map setter). Image paths become textures of the application's
    // image manager, which is refreshed afterwards. Needs `sgApp` for images.
    void applyTo(SgShape &shape) const;

    // A channel from 0 to 1 as an 8-bit value: the integer part of v * 255, held to 0..255
    // (not-a-number gives 0).
    static int channelFromFloat(float value);

private:
    std::vector<SgReturnMaterial> m_materials;
};
