#include "facetor/sgfacetorreturn.h"

#include "exchange/sgreturnrecordwriter.h"
#include "sgcore/geometry/sgmap.h"
#include "sgcore/geometry/sgpolymesh.h"

namespace {

// The node's geometry as a host polygon mesh, in the modeler's units.
void buildMesh(const SgExchangeNode &node, SgPolyMesh &mesh) {
    mesh.beginEdit(true);
    SgVec3 *vertices = mesh.setVertexArray(node.vertexCount());
    for (int i = 0; i < node.vertexCount(); ++i)
        vertices[i] = SgVec3(node.vertices[size_t(i) * 3], node.vertices[size_t(i) * 3 + 1],
                             node.vertices[size_t(i) * 3 + 2]);
    const bool withUvs = node.uvCount() > 0;
    if (withUvs) {
        auto *uvs = new SgMap(SgMap::UVMap);
        for (int i = 0; i < node.uvCount(); ++i)
            uvs->appendPnt2Value(node.uvs[size_t(i) * 2], node.uvs[size_t(i) * 2 + 1]);
        mesh.setUVList(uvs);
    }
    for (const SgExchangeNode::Facet &facet : node.facets) {
        mesh.activateMaterial(int(facet.material));
        mesh.startFace();
        for (uint32_t c = 0; c < facet.cornerCount; ++c) {
            const SgExchangeNode::Corner &corner = node.corners[facet.firstCorner + c];
            mesh.addFaceEdge(corner.vertex, withUvs ? corner.uv : -1);
        }
        mesh.finishFace();
    }
    mesh.finishEdit();
}

SgReturnMaterial returnMaterial(const SgExchangeNode::Material &material) {
    SgReturnMaterial out;
    out.name = material.name;
    std::copy(std::begin(material.diffuse), std::end(material.diffuse), out.diffuse);
    out.diffuseImage = material.diffuseImageCopy;
    std::copy(std::begin(material.specular), std::end(material.specular), out.specular);
    out.glossiness = 1.0f - material.invertedGlossiness;
    out.opacity = material.opacity;
    out.bumpStrength = material.bumpStrength;
    out.bumpImage = material.bumpImageCopy;
    return out;
}

} // namespace

QByteArray SgFacetorReturn::encode(const SgExchangeNode &node) {
    SgPolyMesh mesh;
    buildMesh(node, mesh);
    std::vector<SgReturnMaterial> materials;
    materials.reserve(size_t(node.materials.size()));
    for (const SgExchangeNode::Material &material : node.materials)
        materials.push_back(returnMaterial(material));
    return SgReturnRecordWriter(node.name, mesh, std::move(materials), node.trailer).toByteArray();
}
