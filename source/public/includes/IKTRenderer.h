// IKTRenderer.h: what the library asks of the host's renderer. The host derives from both classes; the library keeps no
// reference to them beyond a call, and calls them on the thread that called it.

#pragma once

#include "KTTexture.h"

#include "KTBeginExports.h"

/// What a renderer may or may not be able to do. Four bytes; the numbers are bits, and others are the renderer's.
enum KTRendererFeatureEnum : int {
    kKTFeatureNPOT = 1,           ///< textures whose sides are no powers of two
    kKTFeatureMipmaps = 2,        ///< textures with mipmaps
    kKTFeatureTextureBorder = 512 ///< textures with a border of one pixel
};

/// Uploads pixels to the renderer and releases textures. Slots: 0 destructor, 1 GetMaxTextureSize, 2 LoadTexture,
/// 3 ReleaseTexture.
class KT_PUBLIC_API KTTextureManager {
  public:
    KTTextureManager();
    virtual ~KTTextureManager();

    /// The longest side of a texture in pixels, without a border.
    virtual unsigned int GetMaxTextureSize() const = 0;

    /// Uploads `width` x `height` pixels into `texture`: a record with an id is loaded anew, one without gets one.
    ///
    /// Row y starts y * rowLength pixels behind `pixels` (params.rowLength; 0 means `width`). Just the `width` pixels of
    /// each of the `height` rows may be read: behind the last row's there may be no memory. With params.bordered, width
    /// and height count the border. The pixels are gone after the call. What it throws goes through the library to the
    /// caller.
    virtual void LoadTexture(unsigned char const *pixels, int width, int height, KTTexture2D &texture,
                             KTLoadTextureParams const &params) = 0;

    /// Releases the texture; the library passes true for `flag`, whose meaning is the renderer's. The record is dropped
    /// afterwards. Records without a texture (id 0) come here, too.
    virtual void ReleaseTexture(KTTexture2D const &texture, bool flag) = 0;

  protected:
    KTTextureManager(KTTextureManager const &other);
    KTTextureManager &operator=(KTTextureManager const &other);
};

/// The host's renderer. Slots: 0 destructor, 1 IsFeatureSupported, 2 GetTextureManager.
class KT_PUBLIC_API IKTRenderer {
  public:
    IKTRenderer();
    virtual ~IKTRenderer();

    virtual bool IsFeatureSupported(KTRendererFeatureEnum feature) const = 0;

    /// The renderer's texture manager, which lives as long as the renderer.
    virtual KTTextureManager &GetTextureManager() const = 0;

  protected:
    IKTRenderer(IKTRenderer const &other);
    IKTRenderer &operator=(IKTRenderer const &other);
};

#include "KTEndExports.h"
