#include "host/source/Overlay.h"

#include <algorithm>
#include <cmath>
#include <cstddef>

namespace movieconv {
namespace {

constexpr int kChannels = 4;

struct Weights {
    double red;
    double blue;
};

Weights WeightsOf(int matrix) {
    constexpr int kBt470 = 5;
    constexpr int kSmpte170 = 6;
    constexpr int kBt2020 = 9;
    constexpr int kBt2020Constant = 10;
    if (matrix == kBt470 || matrix == kSmpte170)
        return {0.299, 0.114};
    if (matrix == kBt2020 || matrix == kBt2020Constant)
        return {0.2627, 0.0593};
    return {0.2126, 0.0722};
}

/// What a pixel of a canvas adds to a picture of 8 bits in video range.
struct Drawn {
    double luma;
    double blue;
    double red;
    double opacity; ///< 0 to 1.
};

Drawn DrawnBy(const uint8_t* pixel, const Weights& weights, double white) {
    const double opacity = pixel[3] / 255.0;
    const double r = pixel[0] / 255.0 * white;
    const double g = pixel[1] / 255.0 * white;
    const double b = pixel[2] / 255.0 * white;
    const double luma = weights.red * r + (1 - weights.red - weights.blue) * g + weights.blue * b;
    return {16 * opacity + 219 * luma, 128 * opacity + 112 * (b - luma) / (1 - weights.blue),
            128 * opacity + 112 * (r - luma) / (1 - weights.red), opacity};
}

/// Null outside.
const uint8_t* PixelAt(const Canvas& canvas, int column, int row) {
    if (column < 0 || column >= canvas.width || row < 0 || row >= canvas.height)
        return nullptr;
    const size_t pixel =
        static_cast<size_t>(row) * static_cast<size_t>(canvas.width) + static_cast<size_t>(column);
    return &canvas.pixels[pixel * kChannels];
}

/// Floor for negative numbers, too.
int Even(int number) {
    return number & ~1;
}

} // namespace

Canvas Trimmed(const uint8_t* rows, int pitch, int width, int height) {
    Canvas canvas;
    int left = width;
    int right = 0;
    int top = height;
    int bottom = 0;
    for (int y = 0; y < height; ++y) {
        const uint8_t* row = rows + static_cast<ptrdiff_t>(pitch) * y;
        for (int x = 0; x < width; ++x) {
            if (row[x * kChannels + 3] == 0)
                continue;
            left = std::min(left, x);
            right = std::max(right, x + 1);
            top = std::min(top, y);
            bottom = y + 1;
        }
    }
    if (right <= left)
        return canvas;
    canvas.x = left;
    canvas.y = top;
    canvas.width = right - left;
    canvas.height = bottom - top;
    for (int y = top; y < bottom; ++y) {
        const uint8_t* row = rows + static_cast<ptrdiff_t>(pitch) * y;
        canvas.pixels.insert(canvas.pixels.end(), row + left * kChannels, row + right * kChannels);
    }
    return canvas;
}

Overlay::Overlay(const Canvas& canvas, const OverlayColours& colours, bool deep) : deep_(deep) {
    if (canvas.Empty())
        return;
    x_ = Even(canvas.x);
    y_ = Even(canvas.y);
    width_ = Even(canvas.x + canvas.width + 1) - x_;
    height_ = Even(canvas.y + canvas.height + 1) - y_;
    const auto count = static_cast<size_t>(width_) * static_cast<size_t>(height_);
    planes_[0] = {std::vector<uint16_t>(count), std::vector<uint16_t>(count, 255)};
    for (int plane : {1, 2})
        planes_[plane] = {std::vector<uint16_t>(count / 4), std::vector<uint16_t>(count / 4, 255)};
    const Weights weights = WeightsOf(colours.matrix);
    const double scale = deep ? 4 : 1;
    for (int y = 0; y < height_; y += 2)
        for (int x = 0; x < width_; x += 2) {
            double blue = 0; // of four pixels, as their opacity
            double red = 0;
            double opacity = 0;
            for (int i = 0; i < 4; ++i) {
                const int column = x + i % 2;
                const int row = y + i / 2;
                const uint8_t* pixel = PixelAt(canvas, column + x_ - canvas.x, row + y_ - canvas.y);
                if (pixel == nullptr)
                    continue;
                const Drawn drawn = DrawnBy(pixel, weights, colours.white);
                const size_t index =
                    static_cast<size_t>(row) * static_cast<size_t>(width_) + static_cast<size_t>(column);
                planes_[0].value[index] = static_cast<uint16_t>(std::lround(drawn.luma * scale));
                planes_[0].rest[index] = static_cast<uint16_t>(255 - pixel[3]);
                blue += drawn.blue / 4;
                red += drawn.red / 4;
                opacity += drawn.opacity / 4;
            }
            const size_t index =
                static_cast<size_t>(y / 2) * static_cast<size_t>(width_ / 2) + static_cast<size_t>(x / 2);
            const auto rest = static_cast<uint16_t>(std::lround(255 * (1 - opacity)));
            planes_[1].value[index] = static_cast<uint16_t>(std::lround(std::max(0.0, blue * scale)));
            planes_[2].value[index] = static_cast<uint16_t>(std::lround(std::max(0.0, red * scale)));
            planes_[1].rest[index] = planes_[2].rest[index] = rest;
        }
}

void Overlay::DrawInto(AVFrame& picture) const {
    for (int plane = 0; plane < 3; ++plane) {
        if (deep_)
            DrawPlane<uint16_t>(plane, picture);
        else
            DrawPlane<uint8_t>(plane, picture);
    }
}

template <class Sample>
void Overlay::DrawPlane(int plane, AVFrame& picture) const {
    const int shift = plane == 0 ? 0 : 1;
    const int most = deep_ ? 1023 : 255;
    const int width = width_ >> shift;
    const int left = x_ / (1 << shift);
    const int top = y_ / (1 << shift);
    const int pictureWidth = (picture.width + shift) >> shift;
    const int pictureHeight = (picture.height + shift) >> shift;
    const int from = std::max(0, -left);
    const int to = std::min(width, pictureWidth - left);
    const int last = std::min(height_ >> shift, pictureHeight - top);
    for (int y = std::max(0, -top); y < last; ++y) {
        auto* row = reinterpret_cast<Sample*>(picture.data[plane] +
                                              static_cast<ptrdiff_t>(picture.linesize[plane]) * (top + y));
        const size_t begin = static_cast<size_t>(y) * static_cast<size_t>(width);
        const uint16_t* value = planes_[plane].value.data() + begin;
        const uint16_t* rest = planes_[plane].rest.data() + begin;
        for (int x = from; x < to; ++x)
            if (rest[x] != 255)
                row[left + x] =
                    static_cast<Sample>(std::min(value[x] + (row[left + x] * rest[x] + 127) / 255, most));
    }
}

} // namespace movieconv
