// Decoders over a host's tables of functions.
#ifndef MOVIECONV_ENGINE_SOURCEDECODERS_H
#define MOVIECONV_ENGINE_SOURCEDECODERS_H

#include "engine/ResultBook.h"
#include "media/Decoders.h"
#include "media/Sources.h"

#include <cstdint>
#include <memory>

class SourceVideo final : public VideoDecoder {
public:
    /// Null, with a line in the log, when the table makes no sense or its source cannot be described.
    static std::unique_ptr<SourceVideo> Make(const MCVideoSource* table);
    ~SourceVideo();

    /// Belongs to a converter from now on: its book is told of errors, and the table of the end.
    void JoinConverter(ResultBook& book) { results = &book; }

    VideoSourceInfo* GetVideoInfo() override { return &info; }
    double Seek(double seconds, int mode) override;
    VideoImage* GetCurrentImage() override;
    int DecodeNext(int mode) override;

private:
    explicit SourceVideo(const MCVideoSource& table) : source(table) {}
    bool Load();
    void Fail(const char* what, int code);

    const MCVideoSource source;
    ResultBook* results = nullptr; // null until it belongs to a converter
    VideoSourceInfo info{};
    VideoImage image{};
    bool loaded = false;
    bool ended = false;
    int64_t count = 0;  // pictures given
    int64_t number = 0; // of the next picture at the frame rate
};

class SourceAudio final : public AudioDecoder {
public:
    /// As SourceVideo's.
    static std::unique_ptr<SourceAudio> Make(const MCAudioSource* table);
    ~SourceAudio();

    void JoinConverter(ResultBook& book) { results = &book; }

    AudioSourceInfo* GetAudioInfo() override { return &info; }
    double Seek(double seconds) override;
    AudioFrame* GetNextFrame() override;

private:
    explicit SourceAudio(const MCAudioSource& table) : source(table) {}
    bool Load();
    void Fail(const char* what, int code);

    const MCAudioSource source;
    ResultBook* results = nullptr; // null until it belongs to a converter
    AudioSourceInfo info{};
    AudioFrame block{};
    bool waits = false; // a block has been read and not been given yet
    bool ended = false;
    int64_t count = 0;    // blocks given
    double seconds = 0.0; // where the next block begins
};

#endif
