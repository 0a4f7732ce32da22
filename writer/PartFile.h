// The temporary file of an output while it grows: its name, its bytes, its multiplexer.
#ifndef MOVIECONV_WRITER_PARTFILE_H
#define MOVIECONV_WRITER_PARTFILE_H

#include "writer/AvioFile.h"
#include "writer/FilePlan.h"
#include "writer/FileRecord.h"
#include "writer/FileSystem.h"
#include "writer/FragmentLog.h"
#include "writer/Mp4Room.h"
#include "writer/PacketWriter.h"

#include <exception>
#include <memory>
#include <optional>
#include <string>

namespace writer {

/// Where the data of `target` really goes. Throws WriterFailure when nothing may be written there.
std::string UsableTarget(const std::string& target, const WriterOptions& options);

/// Created beside the target, under its name with ".part"; removed again unless it is kept. Its record is
/// told how it grows.
class PartFile {
public:
    /// Throws WriterFailure, and leaves nothing behind then.
    PartFile(const std::string& target, const FilePlan& plan, std::shared_ptr<FileRecord> record,
             FileSystem& files);
    PartFile(const PartFile&) = delete;
    PartFile& operator=(const PartFile&) = delete;
    ~PartFile();

    /// It stays from now on, whatever happens, and the record knows where.
    void Keep();

    /// Streams are added to it before WriteHeader.
    PacketWriter& Streams() { return *packets_; }
    const PacketWriter& Streams() const { return *packets_; }

    /// The header, out to the disk. Throws WriterFailure.
    void WriteHeader();

    /// Any thread. Throws WriterFailure.
    void Write(AVPacket& packet, int stream);

    /// What is left, out to the disk. Throws WriterFailure.
    void WriteTrailer();

    /// Cuts off what has begun and never ended, for want of room, memory or an end. Returns the size.
    int64_t CutToWhole();

    void Remove();

    /// Tells the record how much is on the disk.
    void TellSize();

    /// Whether it has certainly lost its name, as with its folder. Allocates nothing.
    bool IsMissing() const { return files_.IsMissing(path_); }

    /// The failure in the terms of the status header. A failed file explains more than what the multiplexer
    /// made of it. Allocates nothing.
    WriterFailure Explain(const std::exception_ptr& error) const noexcept;

    /// Room for the index of a fragmented file; else null.
    const Mp4Room* Room() const { return room_ ? &*room_ : nullptr; }
    const FragmentLog& Fragments() const { return fragments_; }

    const std::string& Path() const { return path_; }
    const std::shared_ptr<ByteFile>& File() const { return io_->File(); }
    bool Broken() const { return io_->Error() != 0; }

private:
    const bool fragmented_;
    const std::shared_ptr<FileRecord> record_;
    FileSystem& files_;
    std::string path_;
    bool kept_ = false;
    std::optional<Mp4Room> room_;
    FragmentLog fragments_;
    std::unique_ptr<AvioFile> io_;
    std::unique_ptr<PacketWriter> packets_;
};

} // namespace writer

#endif
