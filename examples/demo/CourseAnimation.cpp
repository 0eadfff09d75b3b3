// CourseAnimation.cpp: a picture that is as high as the stage fades in, scrolls from its left end to its right one, and
// fades out.
//
//     frame     0            25                        75           100
//               left end, -> left end, -- scrolling -> right end -> right end,
//               invisible    opaque                    opaque       invisible

#include "CourseAnimation.h"

#include "KTInterpolator.h"
#include "KTIntRect.h"
#include "KTRect.h"
#include "Table.h"

#include <algorithm>

namespace {

constexpr int kFramesBetweenRows = 10;
constexpr std::size_t kNameWidth = 60;

// The picture as high as the stage, centred at the origin, as the renderer's quads are.
KTQuad3D QuadOf(PictureSize const &size) {
    float const scale = float{kStageHeight} / static_cast<float>(size.height);
    float const x = static_cast<float>(size.width) * scale / 2;
    float const y = float{kStageHeight} / 2;
    return {{-x, -y, 0}, {x, -y, 0}, {x, y, 0}, {-x, y, 0}};
}

// While it lives, interpolation is done in that way.
class ModeScope {
  public:
    explicit ModeScope(KTInterpolationModeEnum mode) { KTInterpolator::SetInterpolationMode(mode); }
    ModeScope(ModeScope const &) = delete;
    ModeScope &operator=(ModeScope const &) = delete;
    ~ModeScope() { KTInterpolator::SetInterpolationMode(m_Former); }

  private:
    KTInterpolationModeEnum const m_Former = KTInterpolator::GetInterpolationMode();
};

// "X", "ALPHA" and "FIRST to LAST": the left edge on the stage in pixels, and the picture's columns that show there.
std::vector<std::string> CellsOf(KTTransform const &transform, KTQuad3D const &quad, PictureSize const &size) {
    KTVector3f const corner = transform.matrix.TransformPoint(quad.bottomLeft);
    KTRect const stage(0, 0, kStageWidth, kStageHeight);
    KTRect shown(0, 0, quad.Width(), quad.Height());
    shown.Offset(corner.x + kStageWidth / 2.0, 0);
    double const left = shown.left;
    shown = shown.Intersection(stage);
    shown.Offset(-left, 0);
    double const scale = kStageHeight / static_cast<double>(size.height);
    KTIntRect const columns = KTIntRect::RoundOut(KTRect(shown.left / scale, 0, shown.right / scale, 1));
    return {Number(left, 0), Number(transform.color.alpha, 2),
            std::to_string(columns.left) + " to " + std::to_string(columns.right - 1)};
}

} // namespace

CoursePicture WidestPicture(CourseFolder const &folder) {
    CoursePicture widest;
    for (CourseFile const &file : folder.files) {
        PictureSize const size = file.kind == FileKind::Picture ? ReadPictureSize(file.path) : PictureSize();
        if (size.problem.empty() && size.width > widest.size.width && size.height != 0) {
            widest = {PrintableTail(file.name, kNameWidth), file.path, size};
        }
    }
    return widest;
}

KTAnimation ScrollOf(KTQuad3D const &quad) {
    // To the right until its left edge is at the stage's left edge; the other end by the same way to the left.
    float const way = (quad.Width() - float{kStageWidth}) / 2;
    auto const at = [](float x, float alpha) {
        return KTTransform(KTMatrix4x4f::Translation({x, 0, 0}), {1, 1, 1, alpha});
    };
    KTAnimation animation;
    animation.AddKeyframe({at(way, 0), 0});
    animation.AddKeyframe({at(way, 1), kLastFrame / 4});
    animation.AddKeyframe({at(-way, 1), kLastFrame * 3 / 4});
    animation.AddKeyframe({at(-way, 0), kLastFrame});
    return animation;
}

std::string ReportAnimation(CourseFolder const &folder) {
    CoursePicture const picture = WidestPicture(folder);
    if (picture.name.empty()) {
        return "";
    }
    using enum Table::Align;
    Table table({{"Frame", Right},
                 {"Eased x", Right},
                 {"Alpha", Right},
                 {"Columns", Left},
                 {"Linear x", Right},
                 {"Alpha", Right},
                 {"Columns", Left}});
    KTQuad3D const quad = QuadOf(picture.size);
    KTAnimation const animation = ScrollOf(quad);
    for (int frame = 0; frame <= kLastFrame; frame += kFramesBetweenRows) {
        std::vector<std::string> cells{std::to_string(frame)};
        for (auto const mode : {kKTInterpolationEaseInEaseOut, kKTInterpolationLinear}) {
            ModeScope const scope(mode);
            std::vector<std::string> const more = CellsOf(animation.GetTransform(frame), quad, picture.size);
            cells.insert(cells.end(), more.begin(), more.end());
        }
        table.AddRow(cells);
    }
    return "Animation of " + picture.name + " on a stage of 1024 x 640\n" + table.Print() + "\n";
}
