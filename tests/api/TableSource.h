// A movie from tables of functions: grey pictures and silence, 10 pictures and 20 blocks of sound a second.
#ifndef MOVIECONV_TESTS_API_TABLESOURCE_H
#define MOVIECONV_TESTS_API_TABLESOURCE_H

#include "api/MovieConv.h"

#include <cmath>
#include <cstring>
#include <functional>
#include <vector>

struct TableSource {
    static constexpr int kWidth = 32, kHeight = 24, kRate = 8000, kBlock = 400; // samples
    int pictures = 10;
    int blocks = 20;
    std::function<int(int number, VideoImage&)> onPicture; // what is different; the result
    std::function<int(int number, AudioFrame&)> onBlock;
    int seeks = 0;
    int releases = 0;

    int picture = 0;
    int block = 0;
    std::vector<unsigned char> plane = std::vector<unsigned char>(64 * 64, 128);
    std::vector<unsigned char> samples = std::vector<unsigned char>(8 * kBlock, 0);

    static TableSource& Self(void* user) { return *static_cast<TableSource*>(user); }

    MCVideoSource Video() {
        return {sizeof(MCVideoSource),
                this,
                [](void* user, VideoFormat* format) {
                    *format = {kWidth, kHeight, 10.0, Self(user).pictures / 10.0};
                    return 1;
                },
                [](void* user, double seconds) {
                    ++Self(user).seeks;
                    Self(user).picture = static_cast<int>(std::lround(seconds * 10.0));
                    return 1;
                },
                [](void* user, VideoImage* image) {
                    TableSource& self = Self(user);
                    if (self.picture >= self.pictures)
                        return 0;
                    image->pY = image->pU = image->pV = self.plane.data();
                    return self.onPicture ? self.onPicture(self.picture++, *image) : (++self.picture, 1);
                },
                [](void* user) { ++Self(user).releases; }};
    }

    MCAudioSource Audio() {
        return {sizeof(MCAudioSource),
                this,
                [](void* user, AudioFormat* format) {
                    *format = {kRate, 1, 16, 0, Self(user).blocks / 20.0};
                    return 1;
                },
                [](void* user, double seconds) {
                    ++Self(user).seeks;
                    Self(user).block = static_cast<int>(std::lround(seconds * 20.0));
                    return 1;
                },
                [](void* user, AudioFrame* frame) {
                    TableSource& self = Self(user);
                    if (self.block >= self.blocks)
                        return 0;
                    frame->pData = self.samples.data();
                    frame->nLength = 2 * kBlock;
                    return self.onBlock ? self.onBlock(self.block++, *frame) : (++self.block, 1);
                },
                [](void* user) { ++Self(user).releases; }};
    }
};

inline MCResult ResultOf(MCHandle handle) {
    MCResult result;
    std::memset(&result, 0xEE, sizeof result);
    result.nSize = sizeof result;
    if (MCGetResult(handle, &result) == 0)
        result.nCategory = -1;
    return result;
}

#endif
