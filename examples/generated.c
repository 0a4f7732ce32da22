/* A host in C: pictures and sound from functions. Usage: generated OUTPUT.mp4 */
#include <movieconv/MovieConv.h>

#include <locale.h>
#include <math.h>
#include <stdio.h>
#include <stdlib.h>
#include <string.h>

enum { WIDTH = 320, HEIGHT = 240, PICTURES = 75, RATE = 25, SAMPLE_RATE = 48000, BLOCK = 480 };

/* All that the functions know; the library hands its address to each of them. */
typedef struct Movie {
    unsigned char luma[WIDTH * HEIGHT];
    unsigned char grey[WIDTH * HEIGHT / 4];
    short samples[BLOCK];
    int picture;
    long sample;
} Movie;

static int GetVideoFormat(void* user, VideoFormat* format) {
    (void)user;
    format->nWidth = WIDTH;
    format->nHeight = HEIGHT;
    format->dFrameRate = RATE;
    format->dDuration = (double)PICTURES / RATE;
    return 1;
}

/* Rings that spread. Size, pitches and time are filled in already; only the planes are missing. */
static int GetPicture(void* user, VideoImage* image) {
    Movie* movie = user;
    if (movie->picture == PICTURES)
        return 0;
    for (int y = 0; y < HEIGHT; ++y)
        for (int x = 0; x < WIDTH; ++x)
            movie->luma[y * WIDTH + x] =
                (unsigned char)(126 +
                                100 * sin(hypot(x - WIDTH / 2, y - HEIGHT / 2) / 8 - movie->picture / 3.0));
    image->pY = movie->luma;
    image->pU = image->pV = movie->grey;
    ++movie->picture;
    return 1;
}

static int GetAudioFormat(void* user, AudioFormat* format) {
    (void)user;
    format->nSampleRate = SAMPLE_RATE;
    format->nChannels = 1;
    format->nBitsPerSample = 16;
    format->dDuration = (double)PICTURES / RATE;
    return 1;
}

static int GetBlock(void* user, AudioFrame* block) {
    Movie* movie = user;
    if (movie->sample >= (long)SAMPLE_RATE * PICTURES / RATE)
        return 0;
    for (int i = 0; i < BLOCK; ++i)
        movie->samples[i] =
            (short)(8000 * sin(6.283185307 * 440 * (double)(movie->sample + i) / SAMPLE_RATE));
    block->pData = (unsigned char*)movie->samples;
    block->nLength = sizeof movie->samples;
    movie->sample += BLOCK;
    return 1;
}

static void TakeLog(void* user, int level, const char* line) {
    (void)user;
    if (level <= MC_LOG_WARNING)
        fprintf(stderr, "%s\n", line);
}

int main(int argc, char** argv) {
    setlocale(LC_ALL, "");
    wchar_t name[4096];
    if (mbstowcs(name, argc == 2 ? argv[1] : "out.mp4", 4096) >= 4096) {
        fprintf(stderr, "the name is too long, or not in the locale's encoding\n");
        return 1;
    }
    Movie* movie = calloc(1, sizeof *movie);
    if (!movie)
        return 1;
    memset(movie->grey, 128, sizeof movie->grey);
    /* A null function for seeking: the library reads on; free() gives the movie up. */
    const MCVideoSource video = {sizeof video, movie, GetVideoFormat, NULL, GetPicture, NULL};
    const MCAudioSource audio = {sizeof audio, movie, GetAudioFormat, NULL, GetBlock, free};

    MCSetLogCallback(TakeLog, NULL);
    MCHandle converter = MCCreateFromSources(&video, &audio);
    EncodeParam param;
    if (!converter || !MCEncodeParamForFile(name, &param)) {
        fprintf(stderr, "no converter, or an extension that tells no format\n");
        return 1;
    }
    MCSetEncodeParam(converter, &param);
    MCSetOutputFile(converter, name);
    MCEnableEvents(converter, 0);
    MCEnableStopOnFailure(converter, 1);
    MCStart(converter, 0.0, 0.0, NULL, NULL, NULL);
    MCWait(converter, MC_INFINITE);
    MCResult result = {.nSize = sizeof result};
    MCGetResult(converter, &result);
    MCDestroy(converter);
    if (!result.bDone) {
        fprintf(stderr, "%s: %s\n", result.szPath, result.szWhat);
        return 1;
    }
    printf("%lld pictures, %lld samples\n", (long long)result.llPicturesWritten,
           (long long)result.llSamplesWritten);
    return 0;
}
