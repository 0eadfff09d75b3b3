// KTRenderModel.h: what is given to the renderer for drawing: textured quads with their transforms, and the settings that
// it starts with. Plain values; any thread may use its own.

#pragma once

#include "KTGraphicsStructs.h"
#include "KTString.h"
#include "KTTexturedQuad.h"
#include "KTTypes.h"

#include <vector>

#include "KTBeginExports.h"

/// A quad and where and how it is shown.
struct KT_PUBLIC_API KTRenderObject3D {
    KTTexturedQuad3D quad;
    KTTransform transform;

    KTRenderObject3D(KTTexturedQuad3D const &quadValue, KTTransform const &transformValue);
};

/// What a renderer draws, in this order.
struct KTPrimitiveRenderModel {
    std::vector<KTRenderObject3D> objects;
};

/// A large picture and where and how it is shown.
class KT_PUBLIC_API KTLargeRenderObject3D {
  public:
    /// No tiles, shown as they are.
    KTLargeRenderObject3D();

    KTLargeRenderObject3D(KTLargeTexturedQuad3D const &quad, KTTransform const &transform);

    /// The picture itself, which may be loaded and changed. Valid as long as this object.
    KTLargeTexturedQuad3D &GetLargeQuad();
    KTLargeTexturedQuad3D const &GetLargeQuad() const;

    /// The transform itself, which may be changed. Valid as long as this object.
    KTTransform &GetTransform();
    KTTransform const &GetTransform() const;

    /// One object for each tile, in the order of the tiles, each with this object's transform. Throws std::bad_alloc.
    KTPrimitiveRenderModel GetPrimitiveRenderModel() const;

  private:
    KTLargeTexturedQuad3D m_Quad;
    KTTransform m_Transform;
};

/// Large pictures, drawn in this order.
struct KT_PUBLIC_API KTCompositeRenderModel {
    std::vector<KTLargeRenderObject3D> objects;

    /// The primitive models of all objects, one behind the other. Throws std::bad_alloc.
    KTPrimitiveRenderModel GetPrimitiveRenderModel() const;
};

/// What a host's renderer is started with. The library carries the values and gives them no meaning.
struct KT_PUBLIC_API KTRendererInitializationParams {
    KTString text0;
    KTString text1;
    KTString text2;
    KTString text3;
    KTString text4;
    KTString text5;
    KTInt32 number = 256;
    KTColor4f color = {0.0F, 0.0F, 0.0F, 1.0F};
    bool flag = false;

    /// Six texts "auto", 256, opaque black, false. Throws std::bad_alloc.
    KTRendererInitializationParams();
};

#include "KTEndExports.h"
