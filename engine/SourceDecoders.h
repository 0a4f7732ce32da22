// Decoders over a host's tables of functions.
#ifndef MOVIECONV_ENGINE_SOURCEDECODERS_H
#define MOVIECONV_ENGINE_SOURCEDECODERS_H

#include "engine/ResultBook.h"
#include "media/Decoders.h"
#include "media/Sources.h"

#include <cstdint>
#include <memory>

/// What MCGetResult and the log are told of a source's error, after `count` of its records; `results` may be
/// null.
void TellSourceError(ResultBook* results, const char* source, const char* what, int code, int64_t count);

/// A host's table, until its converter ends.
template <class Table>
class SourceTable {
public:
    SourceTable(const SourceTable&) = delete;
    SourceTable& operator=(const SourceTable&) = delete;

    /// Belongs to a converter from now on: its book is told of errors, and the table of the end.
    void JoinConverter(ResultBook& book) { results = &book; }

    /// Another conversion begins, on the thread that reads: where an earlier one left off is not its start. A
    /// source that cannot be sought goes on there all the same.
    void BeginConversion() {
        ended = false;
        isBehind = count > 0 && source.pfnSeek;
    }

protected:
    explicit SourceTable(const Table& table) : source(table) {}
    ~SourceTable() {
        if (results && source.pfnRelease)
            source.pfnRelease(source.pUser);
    }

    void Fail(const char* kind, const char* what, int code) {
        ended = true;
        TellSourceError(results, kind, what, code, count);
    }

    const Table source;
    bool ended = false;
    bool isBehind = false; // stands where an earlier conversion ended, and is to be sought
    int64_t count = 0;     // records given

private:
    ResultBook* results = nullptr; // null until it belongs to a converter
};

class SourceVideo final : public VideoDecoder, public SourceTable<MCVideoSource> {
public:
    /// Null, with a line in the log, when the table makes no sense or its source cannot be described.
    static std::unique_ptr<SourceVideo> Make(const MCVideoSource* table);

    VideoSourceInfo* GetVideoInfo() override { return &info; }
    double Seek(double seconds, int mode) override;
    VideoImage* GetCurrentImage() override;
    int DecodeNext(int mode) override;

private:
    explicit SourceVideo(const MCVideoSource& table) : SourceTable(table) {}
    bool Load();

    VideoSourceInfo info{};
    VideoImage image{};
    bool loaded = false;
    int64_t number = 0; // of the next picture at the frame rate
};

class SourceAudio final : public AudioDecoder, public SourceTable<MCAudioSource> {
public:
    /// As SourceVideo's.
    static std::unique_ptr<SourceAudio> Make(const MCAudioSource* table);

    AudioSourceInfo* GetAudioInfo() override { return &info; }
    double Seek(double seconds) override;
    AudioFrame* GetNextFrame() override;

private:
    explicit SourceAudio(const MCAudioSource& table) : SourceTable(table) {}
    bool Load();

    AudioSourceInfo info{};
    AudioFrame block{};
    bool waits = false;   // a block has been read and not been given yet
    double seconds = 0.0; // where the next block begins
};

#endif
