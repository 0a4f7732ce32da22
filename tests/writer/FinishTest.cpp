// Files of the MP4 family are finished where they lie. Whenever the program is killed in that, and whatever
// part of what it wrote has reached the disk, the file is a whole movie.
#include "MovieReader.h"
#include "tests/support/Folder.h"
#include "writer/FragmentLog.h"
#include "writer/Fragments.h"
#include "writer/MediaFile.h"
#include "writer/Mp4Index.h"
#include "writer/Mp4Room.h"
#include "writer/OptionSets.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cstdint>
#include <filesystem>
#include <fstream>
#include <memory>
#include <string>
#include <utility>
#include <vector>

namespace {

struct Piece {
    int64_t position;
    std::string data;
};

/// What happens to the temporary file once all data is in it.
struct Close {
    std::string before;                      ///< The file as it had grown.
    std::vector<std::vector<Piece>> written; ///< From one sync to the next, every write in two pieces.
};

class RecordedFile final : public writer::ByteFile {
public:
    RecordedFile(std::unique_ptr<writer::ByteFile> file, std::string path, Close& close)
        : file_(std::move(file)), path_(std::move(path)), close_(close) {}

    int64_t Write(const uint8_t* data, int64_t size) override {
        const int64_t position = file_->Seek(0, SEEK_CUR);
        // The index comes where something is already, or in a box that readers skip.
        const bool closing =
            size > 8 && ((IsBox(data, "moov") && position < file_->Seek(0, SEEK_END)) || IsBox(data, "free"));
        file_->Seek(position, SEEK_SET);
        if (closing && close_.written.empty()) {
            close_.before = ReadFile(path_);
            close_.written.emplace_back();
        }
        if (close_.written.empty())
            return file_->Write(data, size);
        const auto text = reinterpret_cast<const char*>(data);
        const int64_t half = (size + 1) / 2;
        close_.written.back().push_back({position, {text, text + half}});
        if (half < size)
            close_.written.back().push_back({position + half, {text + half, text + size}});
        return file_->Write(data, size);
    }
    int64_t Read(uint8_t* data, int64_t size) override { return file_->Read(data, size); }
    int64_t Seek(int64_t offset, int whence) override { return file_->Seek(offset, whence); }
    int64_t Truncate(int64_t size) override { return file_->Truncate(size); }
    int64_t Sync() override {
        if (!close_.written.empty())
            close_.written.emplace_back();
        return file_->Sync();
    }

private:
    static bool IsBox(const uint8_t* data, const char* type) { return std::equal(type, type + 4, data + 4); }

    std::unique_ptr<writer::ByteFile> file_;
    const std::string path_;
    Close& close_;
};

class RecordedFiles final : public writer::FileSystem {
public:
    explicit RecordedFiles(Close& close) : close_(close) {}

    std::unique_ptr<writer::ByteFile> Create(const std::string& path, const std::string& like,
                                             int& error) override {
        std::unique_ptr<writer::ByteFile> file = writer::SystemFiles().Create(path, like, error);
        return file ? std::make_unique<RecordedFile>(std::move(file), path, close_) : nullptr;
    }
    int Rename(const std::string& from, const std::string& to, bool replace) override {
        return writer::SystemFiles().Rename(from, to, replace);
    }
    int Remove(const std::string& path) override { return writer::SystemFiles().Remove(path); }
    bool IsMissing(const std::string& path) override { return writer::SystemFiles().IsMissing(path); }
    int SyncFolder(const std::string& path) override { return writer::SystemFiles().SyncFolder(path); }

private:
    Close& close_;
};

void Apply(std::string& file, const Piece& piece) {
    const auto end = static_cast<size_t>(piece.position) + piece.data.size();
    file.resize(std::max(file.size(), end), '\0');
    file.replace(static_cast<size_t>(piece.position), piece.data.size(), piece.data);
}

uint64_t NumberAt(const std::string& file, size_t at, int bytes) {
    uint64_t value = 0;
    for (int i = 0; i < bytes; ++i)
        value = value << 8 | static_cast<unsigned char>(file[at + static_cast<size_t>(i)]);
    return value;
}

/// Where the boxes of a file begin, and where the last one ends.
std::vector<size_t> BoxPlaces(const std::string& file) {
    std::vector<size_t> places{0};
    while (places.back() + 16 <= file.size()) {
        const uint64_t size = NumberAt(file, places.back(), 4);
        places.push_back(places.back() + (size == 1 ? NumberAt(file, places.back() + 8, 8) : size));
    }
    return places;
}

/// The types of the boxes of a file, in their order.
std::string Boxes(const std::string& file) {
    const std::vector<size_t> places = BoxPlaces(file);
    std::string types;
    for (size_t i = 0; i + 1 < places.size(); ++i)
        types += file.substr(places[i] + 4, 4) + " ";
    return places.back() == file.size() ? types : types + "and a part";
}

struct Layout {
    const char* name;
    uint32_t format, sound;
    double length; ///< Of the source, as the writer is told, in seconds; it lasts 12.
    const char* boxes;
    const char* timecode = "";
};

class Finish : public testing::TestWithParam<Layout> {
protected:
    Finish() {
        movie_.width = 64;
        movie_.height = 48;
        movie_.pictures = 300;
        movie_.soundSeconds = 12;
        movie_.param.fccFileFormat = GetParam().format;
        movie_.param.fccAudio = GetParam().sound;
    }

    /// Writes the movie and records its close.
    void Write() {
        RecordedFiles files(close_);
        writer::OptionSet set(kWriterDefaultSet, WriterOptions{});
        set.ChangeExtras([](writer::Extras& extras) {
            return writer::SetTag(extras.pictures.tags, "timecode", GetParam().timecode);
        });
        VideoFormat video = movie_.Video();
        AudioFormat audio = movie_.Audio();
        video.dDuration = audio.dDuration = GetParam().length;
        writer::MediaFile file(path_, movie_.param, &video, &audio, set.Open(path_), files);
        movie_.WriteAll(&file);
        ASSERT_TRUE(file.Close());
        ASSERT_FALSE(close_.written.empty());
    }

    Folder folder_;
    const std::string path_ = folder_ / "movie";
    TestMovie movie_;
    Close close_;
};

TEST_P(Finish, WhateverHasReachedTheDiskIsAWholeMovie) {
    Write();
    EXPECT_EQ(Boxes(ReadFile(path_)), GetParam().boxes);
    const ReadMovie whole = ReadMovieFile(path_);
    ASSERT_TRUE(whole.readable);
    ASSERT_EQ(whole.pictures.size(), 300U);
    std::string timecode;
    WithStreams(path_, [&](const AVStream& stream) {
        const AVDictionaryEntry* entry = av_dict_get(stream.metadata, "timecode", nullptr, 0);
        timecode = entry != nullptr ? entry->value : timecode;
    });
    EXPECT_EQ(timecode, GetParam().timecode);
    const std::string torn = folder_ / "torn";
    std::string before = close_.before;
    for (const std::vector<Piece>& pieces : close_.written) {
        // Between two syncs, pieces reach the disk in any order.
        ASSERT_LE(pieces.size(), 8U);
        for (unsigned which = 0; which < 1U << pieces.size(); ++which) {
            SCOPED_TRACE("pieces " + std::to_string(which) + " of " + std::to_string(pieces.size()));
            std::string file = before;
            for (size_t piece = 0; piece < pieces.size(); ++piece)
                if ((which >> piece & 1) != 0)
                    Apply(file, pieces[piece]);
            WriteFile(torn, file);
            ExpectSame(ReadMovieFile(torn), whole);
        }
        for (const Piece& piece : pieces)
            Apply(before, piece);
    }
    EXPECT_TRUE(before == ReadFile(path_));
}

TEST_P(Finish, FragmentsAreLearnedFromTheBytesOnTheirWay) {
    Write();
    writer::FragmentLog log;
    const std::string& file = close_.before;
    constexpr size_t kSteps[] = {1, 7, 4096, 3, 100'000, 12};
    size_t step = 0;
    for (size_t at = 0; at < file.size(); ++step) {
        const size_t size = std::min(kSteps[step % std::size(kSteps)], file.size() - at);
        log.Take(static_cast<int64_t>(at), reinterpret_cast<const uint8_t*>(&file[at]),
                 static_cast<int64_t>(size));
        at += size;
    }
    std::vector<writer::PlacedPacket> packets;
    log.ForEach([&](const writer::PlacedPacket& packet) { packets.push_back(packet); });
    EXPECT_EQ(log.End(), static_cast<int64_t>(file.size()));
    EXPECT_LE(log.Size(), 16 * static_cast<int64_t>(packets.size()));
    WriteFile(folder_ / "grown", file);
    size_t number = 0;
    ReadPackets(folder_ / "grown", [&](const AVPacket& packet) {
        ASSERT_LT(number, packets.size());
        const auto same = std::find_if(packets.begin(), packets.end(), [&](const writer::PlacedPacket& each) {
            return each.position == packet.pos;
        });
        ASSERT_NE(same, packets.end());
        EXPECT_EQ(same->stream, packet.stream_index);
        EXPECT_EQ(same->size, packet.size);
        EXPECT_EQ(same->dts, packet.dts);
        EXPECT_EQ(same->pts, packet.pts);
        EXPECT_EQ(same->key, (packet.flags & AV_PKT_FLAG_KEY) != 0);
        ++number;
    });
    EXPECT_EQ(number, packets.size());
}

/// The size to which the file would be cut.
size_t WholeSize(const std::string& file) {
    const Folder folder;
    int error = 0;
    const auto made = writer::SystemFiles().Create(folder / "part", "", error);
    const auto size = static_cast<int64_t>(file.size());
    EXPECT_EQ(made->Write(reinterpret_cast<const uint8_t*>(file.data()), size), size);
    return static_cast<size_t>(writer::WholeFragments(*made, size));
}

// As the multiplexer leaves them when it gets no memory for data, or fails in the midst of a packet.
TEST_P(Finish, FragmentsAreWholeWithAllTheirDataAndNothingElse) {
    Write();
    const std::string& file = close_.before;
    ASSERT_EQ(WholeSize(file), file.size());
    const std::vector<size_t> places = BoxPlaces(file);
    size_t box = 0;
    for (int fragments = 0; fragments < 3; ++box)
        fragments += file.compare(places[box] + 4, 4, "moof") == 0 ? 1 : 0;
    const size_t head = places[box - 1];
    const size_t data = places[box];
    ASSERT_EQ(file.substr(data + 4, 4), "mdat");
    constexpr size_t kBytes = 40;
    const auto withSize = [&](std::string changed, uint64_t size) {
        for (size_t i = 0; i < 4; ++i)
            changed[data + i] = static_cast<char>(size >> (24 - 8 * i));
        return changed;
    };
    const uint64_t size = NumberAt(file, data, 4);
    const std::string lost = std::string(file).erase(data + 20, kBytes);
    const std::string stray = std::string(file).insert(data + 20, kBytes, 'x');
    for (const std::string& broken : {lost, withSize(lost, size - kBytes), withSize(stray, size + kBytes),
                                      file.substr(0, data + 20), file.substr(0, head + 3)})
        EXPECT_EQ(WholeSize(broken), head);
}

/// Puts two holes of 2.25 GiB in front of the first fragment of `grown`, which the log learns as it is
/// written.
std::unique_ptr<writer::ByteFile> WriteSparse(const std::string& path, const std::string& grown,
                                              writer::FragmentLog& log) {
    int error = 0;
    std::unique_ptr<writer::ByteFile> file = writer::SystemFiles().Create(path, path, error);
    const auto write = [&](int64_t position, const std::string& data) {
        const auto bytes = reinterpret_cast<const uint8_t*>(data.data());
        file->Seek(position, SEEK_SET);
        EXPECT_EQ(file->Write(bytes, static_cast<int64_t>(data.size())), static_cast<int64_t>(data.size()));
        log.Take(position, bytes, static_cast<int64_t>(data.size()));
    };
    constexpr int64_t kHole = 0x90000000;
    const size_t first = grown.find("moof") - 4;
    const auto at = static_cast<int64_t>(first);
    write(0, grown.substr(0, first));
    for (const int64_t hole : {at, at + kHole})
        write(hole, std::string("\x90\0\0\0free", 8));
    write(at + 2 * kHole, grown.substr(first));
    return file;
}

TEST_P(Finish, ReachesBeyondFourGigabytes) {
    Write();
    const std::string& grown = close_.before;
    writer::FragmentLog log;
    const std::string path = folder_ / "sparse";
    const std::unique_ptr<writer::ByteFile> file = WriteSparse(path, grown, log);
    const size_t free = grown.find("free") - 4;
    writer::Mp4Room room(static_cast<int64_t>(NumberAt(grown, free, 4)));
    ASSERT_EQ(room.Close(*file), 0);
    const writer::Container& container = *writer::FindContainer(GetParam().format);
    const writer::Extras extras;
    const writer::TrackLabel label;
    const auto makeIndex = [&](int64_t place) {
        writer::Mp4Index index(container, true, extras, place);
        WithStreams(path_, [&](const AVStream& stream) {
            if (stream.codecpar->codec_type ==
                AVMEDIA_TYPE_DATA) // the timecode, which is made with the index
                return;
            index.AddStream(
                {stream.codecpar,
                 stream.time_base,
                 stream.avg_frame_rate,
                 {1, 1},
                 0,
                 &writer::FindCarriage(container, stream.index == 0 ? FourCC("XVID") : GetParam().sound),
                 &label},
                0);
        });
        log.ForEach([&](const writer::PlacedPacket& packet) {
            std::vector<uint8_t> content;
            if (index.WantsContent(packet)) {
                content.resize(static_cast<size_t>(packet.size));
                file->Seek(packet.position, SEEK_SET);
                EXPECT_EQ(file->Read(content.data(), packet.size), packet.size);
            }
            index.Add(packet, content);
        });
        return index.Finish();
    };
    room.Finish(*file, makeIndex, 0, [](writer::ByteFile&) {});
    const ReadMovie movie = ReadMovieFile(path);
    EXPECT_TRUE(movie.readable);
    EXPECT_EQ(movie.pictures.size(), 300U);
    EXPECT_GT(movie.samples, 11 * 44100);
}

INSTANTIATE_TEST_SUITE_P(
    Layouts, Finish,
    testing::Values(
        Layout{"InFront", FourCC("MP4 "), FourCC("AAC "), 12, "ftyp free moov free mdat "},
        Layout{"InFrontOfQuickTime", FourCC("MOV "), FourCC("AAC "), 12, "ftyp free moov free mdat "},
        Layout{"DescribedByItsPackets", FourCC("MP4 "), FourCC("AC3 "), 12, "ftyp free moov free mdat "},
        Layout{"Behind", FourCC("MP4 "), FourCC("AAC "), 0.1, "ftyp free mdat moov "},
        Layout{"WithTimecode", FourCC("MOV "), FourCC("AAC "), 12, "ftyp free moov free mdat ",
               "10:00:00:00"}),
    [](const auto& info) { return info.param.name; });

} // namespace
