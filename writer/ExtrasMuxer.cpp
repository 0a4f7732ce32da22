#include "writer/ExtrasMuxer.h"

#include "media/MediaRecords.h"
#include "writer/MatroskaLanguages.h"
#include "writer/WriterStatus.h"

extern "C" {
#include <libavutil/avstring.h>
}

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <cstring>
#include <iterator>
#include <new>
#include <string>
#include <vector>

namespace writer {
namespace {

void SetTags(AVDictionary*& metadata, const Tags& tags) {
    for (const auto& [key, value] : tags)
        av::CheckMemory(av_dict_set(&metadata, key.c_str(), value.c_str(), 0));
}

/// What the container can hold. Where comment and description have one name, what would be lost goes into one
/// text.
Tags TagsFor(const Container& container, Tags tags) {
    for (auto tag = tags.begin(); tag != tags.end();)
        tag = CarriesTag(container, tag->first, tag->second) ? std::next(tag) : tags.erase(tag);
    const auto find = [&](const char* key) {
        return std::find_if(tags.begin(), tags.end(),
                            [&](const auto& tag) { return av_strcasecmp(tag.first.c_str(), key) == 0; });
    };
    const auto comment = find("comment");
    const auto description = find("description");
    if ((container.ways & kOneComment) == 0 || comment == tags.end() || description == tags.end())
        return tags;
    if (comment->second != description->second)
        description->second += "\n" + comment->second;
    tags.erase(comment);
    return tags;
}

/// MP4 has 16 bits for the length of a text; the multiplexer takes the rest of a longer one.
std::string TitleFor(const Container& container, const OutputChapter& chapter) {
    constexpr size_t kMost = 65535;
    if (container.kind != ContainerKind::kFragmented || chapter.title.size() <= kMost)
        return chapter.title;
    size_t length = kMost;
    while (length > 0 && (static_cast<unsigned char>(chapter.title[length]) & 0xC0) == 0x80)
        --length; // the middle of a character
    return chapter.title.substr(0, length);
}

/// Zeroed memory of FFmpeg's, for `count` objects.
template <class Type>
Type* New(size_t count = 1) {
    void* memory =
        av_calloc(count, sizeof(Type)); // NOLINT(bugprone-sizeof-expression): arrays of pointers, too
    if (memory == nullptr)
        throw std::bad_alloc();
    return static_cast<Type*>(memory);
}

AVStream& NewStream(AVFormatContext& output) {
    AVStream* made = avformat_new_stream(&output, nullptr);
    if (made == nullptr)
        throw std::bad_alloc();
    return *made;
}

} // namespace

bool ExtrasMuxer::IsMatroska() const {
    return std::strcmp(container_.muxer, "matroska") == 0 || std::strcmp(container_.muxer, "webm") == 0;
}

void ExtrasMuxer::SetMovieTags(AVFormatContext& output) const {
    if (Carries(kWriterFormatTags))
        SetTags(output.metadata, TagsFor(container_, extras_.tags));
}

void ExtrasMuxer::SetLabel(AVStream& stream, const TrackLabel& label) const {
    if (Carries(kWriterFormatTags)) {
        Tags tags = label.tags;
        if (tags.erase("language_tag") != 0 && IsMatroska())
            tags["language"] = LanguagePlace(label);
        SetTags(stream.metadata, tags);
        if ((container_.ways & kTagsInStream) != 0)
            SetTags(stream.metadata, TagsFor(container_, extras_.tags));
    }
    stream.disposition = label.flags;
}

void ExtrasMuxer::AddStreams(AVFormatContext& output) {
    if (Carries(kWriterFormatAttachments))
        AddAttachments(output);
    else if (Carries(kWriterFormatCover) && !fragmented_)
        AddCover(output);
}

void ExtrasMuxer::AddAttachments(AVFormatContext& output) const {
    const auto add = [&output](const std::string& name, const std::string& mimeType, const Bytes& data,
                               const std::string& description = {}) {
        AVStream& made = NewStream(output);
        AVCodecParameters& parameters = *made.codecpar;
        parameters.codec_type = AVMEDIA_TYPE_ATTACHMENT;
        parameters.extradata = New<uint8_t>(data->size() + AV_INPUT_BUFFER_PADDING_SIZE);
        std::copy(data->begin(), data->end(), parameters.extradata);
        parameters.extradata_size = static_cast<int>(data->size());
        SetTags(made.metadata, {{"filename", name}, {"mimetype", mimeType}});
        if (!description.empty()) // or it would be there, and say nothing
            SetTags(made.metadata, {{"title", description}});
    };
    if (const Cover& cover = extras_.cover; cover.codec != AV_CODEC_ID_NONE) {
        const bool png = cover.codec == AV_CODEC_ID_PNG;
        add(!cover.fileName.empty() ? cover.fileName
            : png                   ? "cover.png"
                                    : "cover.jpg",
            png ? "image/png" : "image/jpeg", cover.data, cover.description);
    }
    for (const Attachment& attachment : extras_.attachments)
        add(attachment.fileName, attachment.mimeType, attachment.data, attachment.description);
}

/// As a stream of one picture, for containers without attachments.
void ExtrasMuxer::AddCover(AVFormatContext& output) {
    if (extras_.cover.codec == AV_CODEC_ID_NONE)
        return;
    AVStream& made = NewStream(output);
    made.codecpar->codec_type = AVMEDIA_TYPE_VIDEO;
    made.codecpar->codec_id = extras_.cover.codec;
    made.codecpar->width = extras_.cover.width;
    made.codecpar->height = extras_.cover.height;
    made.disposition = AV_DISPOSITION_ATTACHED_PIC;
    SetTags(made.metadata, {{"comment", "Cover (front)"}}); // what kind of picture it is
    if (!extras_.cover.description.empty())
        SetTags(made.metadata, {{"title", extras_.cover.description}});
    made.time_base = {1, 90000};
    coverStream_ = made.index;
}

int ExtrasMuxer::WriteCover(AVFormatContext& output) const {
    if (coverStream_ < 0)
        return 0;
    const std::vector<uint8_t>& data = *extras_.cover.data;
    const av::Packet cover = av::NewPacket();
    av::CheckMemory(av_new_packet(cover.get(), static_cast<int>(data.size())));
    std::copy(data.begin(), data.end(), cover->data);
    cover->stream_index = coverStream_;
    cover->pts = cover->dts = 0;
    cover->flags |= AV_PKT_FLAG_KEY;
    return av_write_frame(&output, cover.get());
}

void ExtrasMuxer::SetChapters(AVFormatContext& output, const std::vector<OutputChapter>& chapters) const {
    if (Carries(kWriterFormatChapters) && !fragmented_)
        AddChapters(output, chapters);
}

void ExtrasMuxer::SetEarlyChapters(AVFormatContext& output) const {
    if (Carries(kWriterFormatEarlyChapters))
        AddChapters(output, extras_.chapters);
}

void ExtrasMuxer::AddChapters(AVFormatContext& output, const std::vector<OutputChapter>& chapters) const {
    if (chapters.empty())
        return;
    output.chapters = New<AVChapter*>(chapters.size());
    for (const OutputChapter& chapter : chapters) {
        auto* made = New<AVChapter>();
        output.chapters[output.nb_chapters++] = made;
        made->id = output.nb_chapters;
        made->time_base = {1, kTicksPerSecond};
        made->start = chapter.begin;
        made->end = chapter.end;
        SetTags(made->metadata, {{"title", TitleFor(container_, chapter)}});
    }
}

} // namespace writer
