// RenderModelTest.cpp: the records of textures, quads and models, and a large quad as a whole.

#include "LogLines.h"
#include "RecordingRenderer.h"
#include "TexturedQuads.h"

#include "KTRenderModel.h"

#include <gtest/gtest.h>

#include <limits>
#include <string>
#include <type_traits>
#include <vector>

using Lines = std::vector<std::string>;

// ---- records ----

TEST(TextureRecord, HasItsDefaults) {
    KTTextureCoord2D const coords;
    EXPECT_EQ(coords.left, 0);
    EXPECT_EQ(coords.top, 0);
    EXPECT_EQ(coords.right, 1);
    EXPECT_EQ(coords.bottom, 1);
    for (KTTexture2D const &texture : {KTTexture2D(), KTTexture2D(0, 0, 0, 1.0, 1.0)}) {
        EXPECT_EQ(texture.id, 0U);
        EXPECT_EQ(texture.width, 0);
        EXPECT_EQ(texture.height, 0);
        EXPECT_EQ(texture.widthFactor, 1.0);
        EXPECT_EQ(texture.heightFactor, 1.0);
        EXPECT_EQ(texture.params, KTLoadTextureParams(true, false, true, false, 0, 0, kKTPixelFormatNone));
        EXPECT_EQ(static_cast<int>(texture.params.pixelFormat), 4);
    }
    KTTexture2D const texture(3, 40, 50, 0.5, 0.25);
    EXPECT_EQ(texture.id, 3U);
    EXPECT_EQ(texture.width, 40);
    EXPECT_EQ(texture.height, 50);
    EXPECT_EQ(texture.widthFactor, 0.5);
    EXPECT_EQ(texture.heightFactor, 0.25);
    EXPECT_EQ(texture.params, KTLoadTextureParams());
}

TEST(TextureRecord, IsOrderedByItsIdAlone) {
    EXPECT_TRUE(KTTexture2D(1, 9, 9, 9, 9) < KTTexture2D(2, 1, 1, 1, 1));
    EXPECT_FALSE(KTTexture2D(2, 1, 1, 1, 1) < KTTexture2D(1, 9, 9, 9, 9));
    EXPECT_FALSE(KTTexture2D(2, 1, 1, 1, 1) < KTTexture2D(2, 9, 9, 9, 9));
    EXPECT_TRUE(KTTexture2D(0x7FFFFFFFU, 1, 1, 1, 1) < KTTexture2D(0xFFFFFFFFU, 1, 1, 1, 1)) << "unsigned";
}

TEST(TexturedQuad, GivesCopiesOfItsTextures) {
    KTTexturedQuad3D quad = TileWith(Rectangle(0, 0, 1, 1), {4, 5});
    quad.textureCoords[1] = {0.25, 0.5, 0.75, 1};
    EXPECT_EQ(quad.GetTexture(1).id, 5U);
    EXPECT_EQ(quad.GetTextureCoord(1), KTTextureCoord2D(0.25, 0.5, 0.75, 1));
    EXPECT_TRUE((std::is_same_v<decltype(quad.GetTexture(0)), KTTexture2D>));
    EXPECT_TRUE((std::is_same_v<decltype(quad.GetTextureCoord(0)), KTTextureCoord2D>));
}

TEST(TexturedQuad, ReportsAnIndexBehindTheLast) {
    KTTexturedQuad3D const quad = TileWith(Rectangle(0, 0, 1, 1), {4});
    LogLines log;
    EXPECT_EQ(quad.GetTexture(1).id, 0U);
    EXPECT_EQ(quad.GetTextureCoord(1), KTTextureCoord2D());
    EXPECT_EQ(log.Take(), (Lines{"Assert failed: KTTexturedQuad3D::GetTexture, index out of range at "
                                 "source/private/utils/KTTexturedQuad:263",
                                 "Assert failed: KTTexturedQuad3D::GetTextureCoord, index out of range at "
                                 "source/private/utils/KTTexturedQuad:271"}));
}

TEST(RenderModel, PairsEveryTileWithTheTransform) {
    KTTransform const moved(KTMatrix4x4f::Translation({1, 2, 3}), {1, 0, 0, 0.5F});
    KTTexturedQuad3D const tile = TileWith(Rectangle(0, 0, 1, 1), {4});
    KTRenderObject3D const object(tile, moved);
    EXPECT_EQ(object.quad.GetTexture(0).id, 4U);
    EXPECT_EQ(object.transform, moved);

    KTLargeTexturedQuad3D large;
    large.quads = {tile, TileWith(Rectangle(1, 0, 2, 1), {5})};
    KTLargeRenderObject3D largeObject(large, moved);
    EXPECT_EQ(largeObject.GetTransform(), moved);
    largeObject.GetTransform().color.alpha = 1;
    EXPECT_EQ(largeObject.GetTransform().color.alpha, 1) << "a reference";
    KTPrimitiveRenderModel const model = largeObject.GetPrimitiveRenderModel();
    ASSERT_EQ(model.objects.size(), 2U);
    EXPECT_EQ(model.objects[0].quad.GetTexture(0).id, 4U);
    EXPECT_EQ(model.objects[1].quad.GetTexture(0).id, 5U);
    EXPECT_EQ(model.objects[1].quad.quad, Rectangle(1, 0, 2, 1));
    EXPECT_EQ(model.objects[0].transform, largeObject.GetTransform());
    EXPECT_EQ(model.objects[1].transform, largeObject.GetTransform());
    EXPECT_TRUE(KTLargeRenderObject3D().GetPrimitiveRenderModel().objects.empty());
    EXPECT_EQ(KTLargeRenderObject3D().GetTransform(), KTTransform());
}

TEST(RenderModel, CompositeJoinsItsObjectsInOrder) {
    KTLargeTexturedQuad3D two;
    two.quads = {TileWith(KTQuad3D(), {1}), TileWith(KTQuad3D(), {2})};
    KTLargeTexturedQuad3D one;
    one.quads = {TileWith(KTQuad3D(), {3})};
    KTTransform const moved(KTMatrix4x4f::Translation({1, 2, 3}), {});
    KTCompositeRenderModel composite;
    EXPECT_TRUE(composite.GetPrimitiveRenderModel().objects.empty());
    composite.objects = {KTLargeRenderObject3D(two, moved), KTLargeRenderObject3D(), KTLargeRenderObject3D(one, {})};
    KTPrimitiveRenderModel const model = composite.GetPrimitiveRenderModel();
    ASSERT_EQ(model.objects.size(), 3U);
    for (std::size_t i = 0; i < 3; ++i) {
        EXPECT_EQ(model.objects[i].quad.GetTexture(0).id, i + 1);
        EXPECT_EQ(model.objects[i].transform, i < 2 ? moved : KTTransform());
    }
}

TEST(RenderModel, InitializationParamsHaveTheirDefaultsAndCanBeCopied) {
    KTRendererInitializationParams params;
    for (KTString const *text :
         {&params.text0, &params.text1, &params.text2, &params.text3, &params.text4, &params.text5}) {
        EXPECT_EQ(*text, KTString("auto"));
    }
    EXPECT_EQ(params.number, 256);
    EXPECT_EQ(params.color, KTColor4f(0, 0, 0, 1));
    EXPECT_FALSE(params.flag);
    params.text5 = "off";
    params.number = 3;
    params.color.red = 1;
    params.flag = true;
    KTRendererInitializationParams const copy = params;
    EXPECT_EQ(copy.text5, KTString("off"));
    EXPECT_EQ(copy.number, 3);
    EXPECT_EQ(copy.color, KTColor4f(1, 0, 0, 1));
    EXPECT_TRUE(copy.flag);
}

// ---- the whole as a quad ----

TEST(LargeQuad, BoundingBoxStartsFromOddValues) {
    KTBoundingBox const empty = KTLargeTexturedQuad3D().GetBoundingBox();
    EXPECT_EQ(empty.minX, std::numeric_limits<float>::max());
    EXPECT_EQ(empty.maxX, std::numeric_limits<float>::min());
    EXPECT_EQ(empty.minY, 3.4028235e38F);
    EXPECT_EQ(empty.maxY, 1.1754944e-38F);
    EXPECT_EQ(empty.minZ, 3.4028235e38F);
    EXPECT_EQ(empty.maxZ, 1.1754944e-38F);

    KTLargeTexturedQuad3D negative;
    negative.quads = {TileWith(Rectangle(-5, -4, -3, -2, -1))};
    EXPECT_EQ(negative.GetBoundingBox(), KTBoundingBox(-5, 1.1754944e-38F, -4, 1.1754944e-38F, -1, 1.1754944e-38F));
}

TEST(LargeQuad, BoundingBoxHoldsEveryCornerOfEveryTile) {
    for (int corner = 0; corner < 4; ++corner) {
        KTQuad3D quad;
        KTVector3f *const corners[] = {&quad.bottomLeft, &quad.bottomRight, &quad.topRight, &quad.topLeft};
        *corners[corner] = {7, 8, 9};
        KTQuad3D opposite;
        *(corners[corner] == &quad.bottomLeft ? &opposite.topLeft : &opposite.bottomLeft) = {-1, -2, -3};
        KTLargeTexturedQuad3D large;
        large.quads = {TileWith(quad), TileWith(opposite)};
        EXPECT_EQ(large.GetBoundingBox(), KTBoundingBox(-1, 7, -2, 8, -3, 9)) << corner;
    }
}

TEST(LargeQuad, QuadIsZeroOrTheTilesOrAroundThemAtTheGreatestDepth) {
    KTLargeTexturedQuad3D large;
    EXPECT_EQ(large.GetQuad(), KTQuad3D());
    KTQuad3D const slanted({-9, -8, -7}, {-6, -5, -4}, {-3, -2, -1}, {-12, -11, -10});
    large.quads = {TileWith(slanted)};
    EXPECT_EQ(large.GetQuad(), slanted) << "one tile's quad is not touched by the box's start values";
    large.quads = {TileWith(Rectangle(-2, -1, 1, 2, 3)), TileWith(Rectangle(1, 2, 5, 6, 4))};
    EXPECT_EQ(large.GetQuad(), Rectangle(-2, -1, 5, 6, 4));
    large.quads = {TileWith(Rectangle(-2, -1, 1, 2)), TileWith(Rectangle(1, 2, 5, 6))};
    EXPECT_EQ(large.GetQuad(), Rectangle(-2, -1, 5, 6, 1.1754944e-38F));
}

TEST(LargeQuad, LoadOfASizeDropsTheTilesAndReleasesNothing) {
    RecordingRenderer const renderer;
    KTLargeTexturedQuad3D large;
    large.quads = {TileWith(KTQuad3D(), {1, 2}), TileWith(KTQuad3D(), {3})};
    large.Load(5, 8, renderer);
    ASSERT_EQ(large.quads.size(), 1U);
    EXPECT_EQ(large.quads[0].quad, Rectangle(-2.5F, -4, 2.5F, 4));
    ASSERT_EQ(large.quads[0].textures.size(), 1U);
    EXPECT_EQ(large.quads[0].GetTexture(0).id, 0U);
    EXPECT_EQ(large.quads[0].GetTexture(0).params, KTLoadTextureParams());
    ASSERT_EQ(large.quads[0].textureCoords.size(), 1U);
    EXPECT_EQ(large.quads[0].GetTextureCoord(0), KTTextureCoord2D());
    EXPECT_TRUE(renderer.manager.released.empty());
    EXPECT_TRUE(renderer.manager.uploads.empty());
}
