// RecordingRenderer.h: a renderer that writes down what the library asks of it, for tests of uploads.

#pragma once

#include "IKTRenderer.h"

#include <cstddef>
#include <set>
#include <stdexcept>
#include <vector>

/// One call of LoadTexture.
struct Upload {
    unsigned char const *pixels = nullptr;
    int width = 0;
    int height = 0;
    KTUInt32 idBefore = 0; ///< what the record held
    KTUInt32 id = 0;       ///< what it was given
    KTLoadTextureParams params;
    std::vector<unsigned char> bytes; ///< the rows read, one behind the other, if they are kept
};

class RecordingManager : public KTTextureManager {
  public:
    unsigned int GetMaxTextureSize() const override { return maximum; }

    void LoadTexture(unsigned char const *pixels, int width, int height, KTTexture2D &texture,
                     KTLoadTextureParams const &params) override {
        if (uploads.size() == failAt) {
            throw std::runtime_error("no more textures");
        }
        Upload upload{pixels, width, height, texture.id, texture.id == 0 ? ++lastId : texture.id, params, {}};
        if (bytesPerPixel != 0) {
            auto const row = static_cast<std::size_t>(width) * bytesPerPixel;
            auto const stride = static_cast<std::size_t>(params.rowLength == 0 ? width : params.rowLength);
            for (std::size_t y = 0; y < static_cast<std::size_t>(height); ++y) {
                unsigned char const *const start = pixels + y * stride * bytesPerPixel;
                upload.bytes.insert(upload.bytes.end(), start, start + row);
            }
        }
        texture.id = upload.id;
        texture.width = width;
        texture.height = height;
        uploads.push_back(std::move(upload));
    }

    void ReleaseTexture(KTTexture2D const &texture, bool flag) override {
        released.push_back(texture.id);
        flags.push_back(flag);
    }

    unsigned int maximum = 2048;
    std::size_t bytesPerPixel = 0; ///< not 0: keep the bytes
    std::size_t failAt = static_cast<std::size_t>(-1);
    KTUInt32 lastId = 0;
    std::vector<Upload> uploads;
    std::vector<KTUInt32> released;
    std::vector<bool> flags;
};

class RecordingRenderer : public IKTRenderer {
  public:
    explicit RecordingRenderer(unsigned int maximum = 2048, std::set<int> const &supported = {1, 2, 512})
        : features(supported) {
        manager.maximum = maximum;
    }
    bool IsFeatureSupported(KTRendererFeatureEnum feature) const override { return features.contains(feature); }
    KTTextureManager &GetTextureManager() const override { return manager; }

    std::set<int> features;
    mutable RecordingManager manager;
};

inline std::set<int> const kNoFeatures;
inline std::set<int> const kOnlyBorders = {kKTFeatureTextureBorder};
