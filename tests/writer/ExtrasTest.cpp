// What a file carries beside pictures and sound: tags, chapters, cover, attachments.
#include "MovieReader.h"
#include "ffmpeg/AvHandles.h"
#include "tests/support/Folder.h"
#include "writer/FormatTable.h"

#include <gtest/gtest.h>

#include <cmath>
#include <cstring>
#include <map>
#include <string>
#include <vector>

namespace {

constexpr int64_t kSecond = 10'000'000;

/// A JPEG of 16x8 pixels, as far as its headers go.
const std::string
    kJpeg("\xFF\xD8\xFF\xFE\x00\x04..\xFF\xC0\x00\x11\x08\x00\x08\x00\x10\x03\x01\x22\x00\x02\x11\x01"
          "\x03\x11\x01\xFF\xD9 and some more bytes, so that it is a packet of some size",
          83);

std::string Value(const AVDictionary* tags, const char* key) {
    const AVDictionaryEntry* entry = av_dict_get(tags, key, nullptr, 0);
    return entry != nullptr ? entry->value : "";
}

struct ReadChapter {
    double begin;
    double end;
    std::string title;
};

/// What a reader finds in a file.
struct ReadExtras {
    std::map<std::string, std::string> tags;
    std::string pictureLanguage;
    std::string soundLanguage;
    int soundFlags = 0;
    std::vector<ReadChapter> chapters;
    std::string cover;
    std::string coverText;
    std::string coverFile;
    std::map<std::string, std::string> attachments;
    unsigned streams = 0;
};

ReadExtras ReadExtrasOf(const std::string& path) {
    ReadExtras read;
    AVFormatContext* context = nullptr;
    if (avformat_open_input(&context, ("file:" + path).c_str(), nullptr, nullptr) < 0)
        return read;
    const av::Input input(context);
    avformat_find_stream_info(context, nullptr);
    read.streams = context->nb_streams;
    const AVDictionaryEntry* entry = nullptr;
    while ((entry = av_dict_get(context->metadata, "", entry, AV_DICT_IGNORE_SUFFIX)) != nullptr)
        read.tags[entry->key] = entry->value;
    if (context->nb_programs > 0)
        read.tags["service_name"] = Value(context->programs[0]->metadata, "service_name");
    for (unsigned i = 0; i < context->nb_streams; ++i) {
        const AVStream& stream = *context->streams[i];
        const AVCodecParameters& parameters = *stream.codecpar;
        if (parameters.codec_type == AVMEDIA_TYPE_AUDIO) {
            read.soundFlags = stream.disposition;
            read.soundLanguage = Value(stream.metadata, "language");
            while ((entry = av_dict_get(stream.metadata, "", entry, AV_DICT_IGNORE_SUFFIX)) != nullptr)
                read.tags.emplace(entry->key, entry->value);
        }
        if ((stream.disposition & AV_DISPOSITION_ATTACHED_PIC) != 0) {
            read.cover.assign(stream.attached_pic.data, stream.attached_pic.data + stream.attached_pic.size);
            read.coverText = Value(stream.metadata, "title");
            read.coverFile = Value(stream.metadata, "filename");
        } else if (parameters.codec_type == AVMEDIA_TYPE_VIDEO) {
            read.pictureLanguage = Value(stream.metadata, "language");
        } else if (parameters.codec_type == AVMEDIA_TYPE_ATTACHMENT)
            read.attachments[Value(stream.metadata, "filename")].assign(
                parameters.extradata, parameters.extradata + parameters.extradata_size);
    }
    for (unsigned i = 0; i < context->nb_chapters; ++i) {
        const AVChapter& chapter = *context->chapters[i];
        read.chapters.push_back({static_cast<double>(chapter.start) * av_q2d(chapter.time_base),
                                 static_cast<double>(chapter.end) * av_q2d(chapter.time_base),
                                 Value(chapter.metadata, "title")});
    }
    return read;
}

/// Texts, three chapters of which the last reaches beyond the end, a cover and a font.
void Fill(uint32_t set) {
    ASSERT_EQ(MWSetTag(set, "title", "Fußweg & \"Brücke\""), 1);
    ASSERT_EQ(MWSetTag(set, "artist", "nobody"), 1);
    ASSERT_EQ(MWSetTag(set, "artist", "Somebody"), 1);
    ASSERT_EQ(MWSetTag(set, "comment", "gone"), 1);
    ASSERT_EQ(MWSetTag(set, "comment", nullptr), 1);
    ASSERT_EQ(MWSetTrackTag(set, 0, "language", "fre"), 1);
    ASSERT_EQ(MWSetTrackTag(set, 1, "language", "eng"), 1);
    ASSERT_EQ(MWAddChapter(set, 0, kSecond / 2, "One"), 1);
    ASSERT_EQ(MWAddChapter(set, kSecond / 2, 3 * kSecond / 2, "Zwei – ü"), 1);
    ASSERT_EQ(MWAddChapter(set, 3 * kSecond / 2, 5 * kSecond, ""), 1);
    EXPECT_EQ(MWDescribeCover(set, "none.jpg", "there is none yet"), 0);
    ASSERT_EQ(MWSetCover(set, kJpeg.data(), static_cast<int64_t>(kJpeg.size())), 1);
    ASSERT_EQ(MWDescribeCover(set, "front.jpg", "Die Brücke"), 1);
    ASSERT_EQ(MWAddAttachment(set, "a.ttf", "font/ttf", "glyphs", 6), 1);
}

class Extras : public testing::Test {
protected:
    Extras() { movie_.Use(registered_); }

    void Choose(const FileFormatInfo& format) {
        movie_.param.fccFileFormat = format.fccFormat;
        movie_.param.fccVideo = format.fccVideoCodecs[0];
        movie_.param.fccAudio = format.fccAudioCodecs[0];
        movie_.hasVideo = format.bHasVideo != 0;
        movie_.hasAudio = format.bHasAudio != 0;
    }

    const Folder folder_;
    const std::string path_ = folder_ / "movie";
    const RegisteredOptions registered_{WriterOptions{}};
    TestMovie movie_;
};

TEST_F(Extras, AreInEachFormatAsFarAsItCarriesThem) {
    Fill(registered_.Set());
    for (const FileFormatInfo* format = MWGetFileFormatInfos(); format->fccFormat != 0; ++format) {
        SCOPED_TRACE(format->szName);
        Choose(*format);
        ASSERT_TRUE(movie_.Write(path_)) << Latest(registered_.Set()).szWhat;
        const uint32_t traits = MWGetFormatTraits(format->fccFormat);
        const ReadExtras read = ReadExtrasOf(path_);
        const bool hasTags = (traits & kWriterFormatTags) != 0;
        const bool isTransport = (format->fccFormat == FourCC("TS  ") ||
                                  format->fccFormat == FourCC("M2TS")); // knows nothing but a service's name
        const auto title = read.tags.find(isTransport ? "service_name" : "title");
        EXPECT_EQ(title != read.tags.end() && title->second == "Fußweg & \"Brücke\"", hasTags);
        EXPECT_EQ(read.tags.count("comment"), 0U);
        EXPECT_EQ(read.tags.count("artist") + read.tags.count("ARTIST"), hasTags && !isTransport ? 1U : 0U);
        const bool isEarly = (traits & kWriterFormatEarlyChapters) != 0; // which tells them as they are
        EXPECT_EQ(read.chapters.size(), isEarly || (traits & kWriterFormatChapters) != 0 ? 3U : 0U);
        if (read.chapters.size() == 3) {
            EXPECT_NEAR(read.chapters[1].begin, 0.5, 0.0011);
            EXPECT_NEAR(read.chapters[1].end, 1.5, 0.0011);
            EXPECT_NEAR(read.chapters[2].end, isEarly ? 5.0 : 2.0, 0.05);
            EXPECT_EQ(read.chapters[1].title, "Zwei – ü");
            EXPECT_EQ(read.chapters[2].title, isEarly ? "ch2" : ""); // ID3 has a name for each besides
        }
        const bool tellsOfPictures = (traits & (kWriterFormatLanguages | kWriterFormatNoPictureLanguage)) ==
                                         uint32_t{kWriterFormatLanguages} &&
                                     movie_.hasVideo;
        EXPECT_EQ(read.pictureLanguage, tellsOfPictures ? "fre" : "");
        EXPECT_EQ(read.cover, (traits & kWriterFormatCover) != 0 ? kJpeg : "");
        EXPECT_EQ(read.coverText, (traits & kWriterFormatCoverText) != 0 ? "Die Brücke" : "");
        EXPECT_EQ(read.coverFile, (traits & kWriterFormatAttachments) != 0 ? "front.jpg" : "");
        EXPECT_EQ(read.attachments.count("a.ttf"), (traits & kWriterFormatAttachments) != 0 ? 1U : 0U);
    }
}

TEST_F(Extras, ChaptersFollowTheSourceIntoAClip) {
    Fill(registered_.Set());
    for (const char* code : {"MP4 ", "MKV "}) {
        SCOPED_TRACE(code);
        ASSERT_EQ(MWAddChapter(registered_.Set(), kSecond, 12 * kSecond / 10 + 1, "too short"), 1);
        movie_.param.fccFileFormat = FourCC(code[0], code[1], code[2], code[3]);
        void* file = movie_.Create(path_);
        ASSERT_NE(file, nullptr);
        TestPicture picture(movie_.width, movie_.height);
        for (int number = 0; number < 25; ++number) { // from 1.2 s of the source to 2.2 s
            VideoImage image = picture.Paint(number, number * kSecond / 25);
            const WriterSourceTime time{kWriterSourceTimeTag, 12 * kSecond / 10 + image.llTime};
            static_assert(sizeof time == sizeof image.reserved);
            std::memcpy(image.reserved, &time, sizeof time);
            ASSERT_EQ(MWWriteVideoFrame(file, &image), 1);
        }
        ASSERT_EQ(MWCloseMediaFile(file, nullptr, nullptr), 1);
        const ReadExtras read = ReadExtrasOf(path_);
        ASSERT_EQ(read.chapters.size(), 2U);
        EXPECT_NEAR(read.chapters[0].begin, 0.0, 0.0011);
        EXPECT_NEAR(read.chapters[0].end, 0.3, 0.0011);
        EXPECT_EQ(read.chapters[0].title, "Zwei – ü");
        EXPECT_NEAR(read.chapters[1].end, 1.0, 0.0011);
    }
}

// Which MP4 has in a track of texts, and the multiplexer from 0 on.
TEST_F(Extras, ChaptersBeginWhereTheFirstOneDoes) {
    const std::vector<std::vector<int>> cases{// milliseconds
                                              {500, 1500},
                                              {300, 1000, 1200},
                                              {200, 400, 800, 1000, 1200}};
    for (const auto& borders : cases) {
        for (const char* code : {"MP4 ", "MOV ", "M4A "}) {
            SCOPED_TRACE(code + std::to_string(borders.size()));
            const RegisteredOptions options{WriterOptions{}};
            movie_.Use(options);
            const FileFormatInfo* format = MWGetFileFormatInfos();
            while (format->fccFormat != FourCC(code[0], code[1], code[2], code[3]))
                ++format;
            Choose(*format);
            for (size_t i = 1; i < borders.size(); ++i)
                MWAddChapter(options.Set(), borders[i - 1] * kSecond / 1000, borders[i] * kSecond / 1000,
                             "A");
            ASSERT_TRUE(movie_.Write(path_)) << Latest(options.Set()).szWhat;
            const ReadExtras read = ReadExtrasOf(path_);
            ASSERT_EQ(read.chapters.size(), borders.size() - 1);
            for (size_t i = 1; i < borders.size(); ++i) {
                EXPECT_NEAR(read.chapters[i - 1].begin, borders[i - 1] / 1000.0, 1e-6);
                EXPECT_NEAR(read.chapters[i - 1].end, borders[i] / 1000.0, 1e-6);
            }
            EXPECT_FALSE(ReadMovieFile(path_).firstChannel.empty());
        }
    }
}

TEST_F(Extras, FlagsOfSoundAreWhereTheTableHasThem) {
    for (const FileFormatInfo* format = MWGetFileFormatInfos(); format->fccFormat != 0; ++format) {
        Choose(*format);
        movie_.hasVideo = false;
        for (const int flag :
             {AV_DISPOSITION_FORCED, AV_DISPOSITION_ORIGINAL, AV_DISPOSITION_DUB, AV_DISPOSITION_COMMENT,
              AV_DISPOSITION_HEARING_IMPAIRED, AV_DISPOSITION_VISUAL_IMPAIRED}) {
            if (format->bHasAudio == 0)
                continue;
            SCOPED_TRACE(format->szName + std::string(" ") + av_disposition_to_string(flag));
            ASSERT_EQ(MWSetTrackFlags(registered_.Set(), kWriterTrackSound, flag), 1);
            ASSERT_TRUE(movie_.Write(path_)) << Latest(registered_.Set()).szWhat;
            const bool isHeld = (MWCarriedTrackFlags(format->fccFormat) & flag) != 0;
            EXPECT_EQ((ReadExtrasOf(path_).soundFlags & flag) != 0, isHeld);
        }
    }
}

TEST_F(Extras, TagsAreInAFileThatStillGrows) {
    Fill(registered_.Set());
    void* file = movie_.Create(path_);
    ASSERT_NE(file, nullptr);
    ASSERT_EQ(MWSetTag(registered_.Set(), "title", "Later"), 1);
    movie_.WriteAll(file);
    EXPECT_EQ(ReadExtrasOf(path_ + ".part").tags["artist"], "Somebody");
    EXPECT_EQ(MWCloseMediaFile(file, nullptr, nullptr), 1);
    EXPECT_EQ(ReadExtrasOf(path_).tags["title"], "Fußweg & \"Brücke\"") << "an open file keeps its own";
}

TEST_F(Extras, OddOnesAreTakenOrRefused) {
    const uint32_t set = registered_.Set();
    const std::string large(100'000, 'x');
    EXPECT_EQ(MWSetTag(set, "description", large.c_str()), 1);
    EXPECT_EQ(MWSetTag(set, "title", "\xFF\xFE not UTF-8"), 1);
    EXPECT_EQ(MWSetTag(set, "", "no key"), 0);
    EXPECT_EQ(MWSetTag(set, nullptr, "no key"), 0);
    EXPECT_EQ(MWSetTag(12345, "title", "no such set"), 0);
    EXPECT_EQ(MWAddChapter(set, 5, 5, "empty"), 0);
    EXPECT_EQ(MWAddChapter(set, kSecond, 0, "backwards"), 0);
    EXPECT_EQ(MWSetCover(set, "not a picture", 13), 0);
    EXPECT_EQ(MWSetCover(set, nullptr, 13), 0);
    EXPECT_EQ(MWAddAttachment(set, "", "font/ttf", "x", 1), 0);
    EXPECT_EQ(MWAddAttachment(set, "a", "font/ttf", "x", 0), 0);
    EXPECT_EQ(MWDescribeAttachment(set, "of nothing"), 0);
    std::string longTitle; // MP4's limit lies within a character
    while (longTitle.size() <= 65535)
        longTitle += "ü";
    for (int number = 0; number < 300; ++number)
        EXPECT_EQ(MWAddChapter(set, number * kSecond / 150, (number + 1) * kSecond / 150,
                               number == 7 ? longTitle.c_str() : "Same"),
                  1);
    std::string cover = kJpeg + std::string(20 << 20, 'x');
    EXPECT_EQ(MWSetCover(set, cover.data(), static_cast<int64_t>(cover.size())), 1);
    for (const char* code : {"MP4 ", "MKV "}) {
        SCOPED_TRACE(code);
        movie_.param.fccFileFormat = FourCC(code[0], code[1], code[2], code[3]);
        ASSERT_TRUE(movie_.Write(path_)) << Latest(set).szWhat;
        ReadExtras read = ReadExtrasOf(path_);
        ASSERT_EQ(read.chapters.size(), 300U);
        EXPECT_EQ(read.chapters[7].title.size(), longTitle.size() - (code[1] == 'P' ? 2 : 0));
        EXPECT_EQ(read.cover.size(), cover.size());
        EXPECT_EQ(read.tags["description"].size() + read.tags["DESCRIPTION"].size(), large.size());
        EXPECT_EQ(ReadMovieFile(path_).firstChannel.empty(), false);
    }
}

} // namespace
