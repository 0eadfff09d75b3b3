// KTRenderModel.cpp: what is given to the renderer for drawing.

#include "KTRenderModel.h"

namespace {

void AppendTiles(KTLargeTexturedQuad3D const &large, KTTransform const &transform,
                 std::vector<KTRenderObject3D> &objects) {
    for (KTTexturedQuad3D const &tile : large.quads) {
        objects.emplace_back(tile, transform);
    }
}

} // namespace

KTRenderObject3D::KTRenderObject3D(KTTexturedQuad3D const &quadValue, KTTransform const &transformValue)
    : quad(quadValue), transform(transformValue) {}

KTLargeRenderObject3D::KTLargeRenderObject3D() = default;

KTLargeRenderObject3D::KTLargeRenderObject3D(KTLargeTexturedQuad3D const &quad, KTTransform const &transform)
    : m_Quad(quad), m_Transform(transform) {}

KTLargeTexturedQuad3D &KTLargeRenderObject3D::GetLargeQuad() { return m_Quad; }

KTLargeTexturedQuad3D const &KTLargeRenderObject3D::GetLargeQuad() const { return m_Quad; }

KTTransform &KTLargeRenderObject3D::GetTransform() { return m_Transform; }

KTTransform const &KTLargeRenderObject3D::GetTransform() const { return m_Transform; }

KTPrimitiveRenderModel KTLargeRenderObject3D::GetPrimitiveRenderModel() const {
    KTPrimitiveRenderModel model;
    model.objects.reserve(m_Quad.quads.size());
    AppendTiles(m_Quad, m_Transform, model.objects);
    return model;
}

KTPrimitiveRenderModel KTCompositeRenderModel::GetPrimitiveRenderModel() const {
    KTPrimitiveRenderModel model;
    for (KTLargeRenderObject3D const &object : objects) {
        AppendTiles(object.GetLargeQuad(), object.GetTransform(), model.objects);
    }
    return model;
}

KTRendererInitializationParams::KTRendererInitializationParams()
    : text0("auto"), text1("auto"), text2("auto"), text3("auto"), text4("auto"), text5("auto") {}
