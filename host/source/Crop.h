// What is cut off pictures at their edges.
#ifndef MOVIECONV_HOST_SOURCE_CROP_H
#define MOVIECONV_HOST_SOURCE_CROP_H

namespace movieconv {

/// Pixels of the picture as it is shown, upright.
struct Crop {
    int top = 0;
    int bottom = 0;
    int left = 0;
    int right = 0;

    bool CutsNothing() const { return top <= 0 && bottom <= 0 && left <= 0 && right <= 0; }
};

} // namespace movieconv

#endif
