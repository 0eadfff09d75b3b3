// CourseTiles.cpp: the course's widest picture, cut into textures for renderers of several limits, faded and animated.

#include "CourseTiles.h"

#include "CourseAnimation.h"
#include "PicturePage.h"
#include "Table.h"
#include "WDisk.h"

#include "KTException.h"
#include "KTGraphicsUtils.h"
#include "KTLogger.h"
#include "KTTexturedQuad.h"
#include "SoftRenderer.h"

#include <algorithm>
#include <optional>
#include <vector>

namespace {

using soft::Blend;
using soft::Canvas;
using soft::Limits;
using soft::Pixel;

constexpr KTUInt64 kMostPixels = KTUInt64{1} << 26;
constexpr KTUInt64 kMostBytes = KTUInt64{1} << 28;
constexpr Pixel kGridColor = {255, 0, 128, 255};
constexpr int kFramesBetweenPictures = 20;
constexpr int kSamples = 2; // of a frame's pixel, in each direction

struct Machine {
    char const *name = nullptr;
    char const *file = nullptr;
    Limits limits;
};

constexpr Machine kMachines[] = {
    {"4096, any size", "tiles-4096-any", {4096, true, true, true}},
    {"1024, any size", "tiles-1024-any", {1024, true, true, true}},
    {"512, powers of two", "tiles-512-powers", {512, false, true, true}},
    {"128, powers of two", "tiles-128-powers", {128, false, false, true}},
    {"1024, no borders", "tiles-1024-no-borders", {1024, true, true, false}},
};

// The picture as the library takes it: BGRA, from the top row on.
struct Bgra {
    int width;
    int height;
    std::vector<unsigned char> bytes;

    explicit Bgra(Canvas const &canvas) : width(canvas.Width()), height(canvas.Height()) {
        for (int y = 0; y < height; ++y) {
            for (int x = 0; x < width; ++x) {
                Pixel const &pixel = canvas.At(x, y);
                bytes.insert(bytes.end(), {pixel[2], pixel[1], pixel[0], pixel[3]});
            }
        }
    }

    KTLargeTexturedQuad3D LoadedBy(soft::Renderer const &renderer) const {
        KTLargeTexturedQuad3D large;
        KTLoadTextureParams params(true, false, true, false, 0, 0, kKTPixelFormatBGRA);
        large.Load(bytes.data(), width, height, width, height, renderer, KTTextureCoord2D(), params);
        return large;
    }
};

std::optional<Canvas> ReadPicture(CoursePicture const &picture) {
    if (KTUInt64{picture.size.width} * picture.size.height > kMostPixels) {
        return std::nullopt;
    }
    return soft::DecodePng(DiskRead(picture.path, kMostBytes).bytes);
}

// While it lives, nothing is logged: a refusal that the table shows is no news for the log.
class LogPause {
  public:
    LogPause() { gKTLogger->LogEnableAtRuntime(false); }
    LogPause(LogPause const &) = delete;
    LogPause &operator=(LogPause const &) = delete;
    ~LogPause() { gKTLogger->LogEnableAtRuntime(true); }
};

std::string ReasonOf(KTLCException const &refusal) {
    return refusal.GetFile().GetUTF8String() + ", line " + std::to_string(refusal.GetLine());
}

// One row of the table; draws the whole with its tile grid onto the page.
std::vector<std::string> TryMachine(Machine const &machine, Canvas const &picture, Bgra const &pixels,
                                    PicturePage &page) {
    soft::Renderer const renderer(machine.limits);
    LogPause const pause;
    try {
        KTLargeTexturedQuad3D const large = pixels.LoadedBy(renderer);
        Canvas drawn(pixels.width, pixels.height);
        renderer.Draw(large, drawn, Blend::Replace);
        bool const isSame = drawn == picture;
        soft::DrawTileGrid(large, drawn, kGridColor);
        std::string const count = std::to_string(large.quads.size());
        page.Picture(machine.file, std::string(machine.name) + ": " + count + (count == "1" ? " texture" : " textures"),
                     drawn);
        return {machine.name, count, std::to_string(renderer.Textures().UploadedBytes()),
                isSame ? "the picture" : "NOT the picture"};
    } catch (KTLCException const &refusal) {
        return {machine.name, "-", "-", "refused: " + ReasonOf(refusal)};
    }
}

// The picture with soft edges.
Bgra Faded(Bgra pixels) {
    KTGraphicsUtils::ApplyEdgeMaskToImage(static_cast<unsigned int>(pixels.width),
                                          static_cast<unsigned int>(pixels.height), kKTPixelFormatBGRA,
                                          KTTextureCoord2D(0.1, 0.25, 0.9, 0.75), pixels.bytes.data());
    return pixels;
}

// The stage with the picture at one frame of its animation, over a plain sea, at half the stage's size.
Canvas FrameOf(soft::Renderer const &renderer, KTLargeTexturedQuad3D const &sea, KTLargeTexturedQuad3D const &large,
               int frame) {
    KTQuad3D const quad = large.GetQuad();
    float const scale = float{kStageHeight} / quad.Height();
    KTVector3f const corner(quad.Width() * scale / 2, float{kStageHeight} / 2, 0);
    KTQuad3D const asHighAsTheStage({-corner.x, -corner.y, 0}, {corner.x, -corner.y, 0}, corner,
                                    {-corner.x, corner.y, 0});
    KTTransform transform = ScrollOf(asHighAsTheStage).GetTransform(frame);
    transform.matrix *= KTMatrix4x4f::Scaling({scale, scale, 1});
    KTCompositeRenderModel stage;
    stage.objects = {KTLargeRenderObject3D(sea, KTTransform()), KTLargeRenderObject3D(large, transform)};
    Canvas canvas(kStageWidth, kStageHeight, {255, 255, 255, 255});
    renderer.Draw(stage.GetPrimitiveRenderModel(), canvas, Blend::Over);
    return soft::Reduced(canvas, kSamples);
}

void AddFadedAndFrames(Bgra const &pixels, PicturePage &page) {
    if (!page.IsWritten()) {
        return;
    }
    soft::Renderer const renderer({512, false, true, true});
    KTLargeTexturedQuad3D const large = Faded(pixels).LoadedBy(renderer);
    Canvas whole(pixels.width, pixels.height);
    renderer.Draw(large, whole, Blend::Replace);
    page.Heading("Faded towards its edges");
    page.Picture("faded", "The outer tenth at both sides and quarter at top and bottom are ramps", whole);
    page.Heading("Fading in, scrolling over the stage, fading out");
    KTLargeTexturedQuad3D sea;
    KTGraphicsUtils::GetConstColoredQuad(renderer, kStageWidth, kStageHeight, {0.05F, 0.2F, 0.35F, 1},
                                         KTTextureCoord2D(), sea);
    for (int frame = 0; frame <= kLastFrame; frame += kFramesBetweenPictures) {
        std::string const number = std::to_string(frame);
        page.Picture("frame-" + number, "Frame " + number, FrameOf(renderer, sea, large, frame));
    }
}

} // namespace

std::string ReportTiles(CourseFolder const &folder, KTPath const &pageFolder) {
    CoursePicture const picture = WidestPicture(folder);
    if (picture.name.empty()) {
        return "";
    }
    std::string const title = "Textures of " + picture.name;
    std::optional<Canvas> const canvas = ReadPicture(picture);
    if (!canvas) {
        return title + "\n  the picture is damaged or too large\n\n";
    }
    Bgra const pixels(*canvas);
    PicturePage page(pageFolder, title);
    using enum Table::Align;
    Table table({{"Largest texture", Left}, {"Textures", Right}, {"Bytes uploaded", Right}, {"Drawn", Left}});
    page.Heading("Tiles under several limits");
    for (Machine const &machine : kMachines) {
        table.AddRow(TryMachine(machine, *canvas, pixels, page));
    }
    soft::Renderer const renderer({128, false, true, true});
    Canvas whole(pixels.width, pixels.height);
    renderer.Draw(pixels.LoadedBy(renderer), whole, Blend::Replace);
    page.Heading("The whole, put together again from the smallest tiles");
    page.Picture("whole", picture.name, whole);
    AddFadedAndFrames(pixels, page);
    std::string text = title + "\n" + table.Print();
    std::string const problem = page.Finish();
    if (!problem.empty()) {
        text += "  " + problem + "\n";
    } else if (page.IsWritten()) {
        text += "  pictures: " + page.Location() + "\n";
    }
    return text + "\n";
}
