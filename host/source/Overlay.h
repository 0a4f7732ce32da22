// What is drawn over pictures: colours with their opacity, laid into planar 4:2:0.
#ifndef MOVIECONV_HOST_SOURCE_OVERLAY_H
#define MOVIECONV_HOST_SOURCE_OVERLAY_H

#include "ffmpeg/AvHandles.h"

#include <array>
#include <cstdint>
#include <vector>

namespace movieconv {

/// A rectangle of red, green, blue and opacity, 8 bits each. The colours are multiplied by the opacity.
struct Canvas {
    int x = 0; ///< Of its left edge in the picture; may lie outside.
    int y = 0;
    int width = 0;
    int height = 0;
    std::vector<uint8_t> pixels; ///< Rows without gaps.

    bool Empty() const { return pixels.empty(); }
};

/// The part of `rows`, `pitch` bytes apart, that is not transparent.
Canvas Trimmed(const uint8_t* rows, int pitch, int width, int height);

/// How colours become those of the pictures.
struct OverlayColours {
    int matrix = 2;   ///< As in ISO/IEC 23091-2.
    double white = 1; ///< The pictures' signal for white; less than 1 where they are brighter than that.
};

class Overlay {
public:
    /// Nothing.
    Overlay() = default;

    /// `canvas` for pictures of 8 or, `deep`, 10 bits.
    Overlay(const Canvas& canvas, const OverlayColours& colours, bool deep);

    bool Empty() const { return width_ == 0; }

    /// Draws into a writable picture of planar 4:2:0 in video range, as deep as told.
    void DrawInto(AVFrame& picture) const;

private:
    struct Plane {
        std::vector<uint16_t> value; // multiplied by the opacity
        std::vector<uint16_t> rest;  // what is left of the picture, of 255
    };

    template <class Sample>
    void DrawPlane(int plane, AVFrame& picture) const;

    int x_ = 0; // even
    int y_ = 0;
    int width_ = 0; // even
    int height_ = 0;
    bool deep_ = false;
    std::array<Plane, 3> planes_;
};

} // namespace movieconv

#endif
