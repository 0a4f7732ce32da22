/// \file
/// The media writer's second header: what the five functions of media/MediaWriter.h have no room for. A host
/// registers the options of a conversion here, and learns here how its files stand and what went wrong. The
/// engine needs none of it.
///
/// Options belong to a set with a number, and so do the files that are created with them:
///
///     WriterOptions options{}; // in C = {0}, and options.nSize = sizeof options
///     options.bKeepExisting = 1;
///     param.nReserved[kWriterSetWord] = MWRegisterOptions(&options);
///     ... MCSetEncodeParam(converter, &param), a conversion, MCDestroy(converter) ...
///     MWUnregisterOptions(param.nReserved[kWriterSetWord]);
///
/// Conversions with sets of their own know nothing of each other, however many there are at once. Those whose
/// parameters name no set share kWriterDefaultSet.
///
/// Records begin with their size, so that they can grow; in C, the caller fills it in. All functions may be
/// called on any thread. Texts are UTF-8; bytes of a file name that are not UTF-8 stand as they are.
#ifndef MOVIECONV_WRITER_WRITERSTATUS_H
#define MOVIECONV_WRITER_WRITERSTATUS_H

#include "media/EncodeParam.h"
#include "media/MediaRecords.h"

#include <stdint.h>
#include <wchar.h>

#ifdef __cplusplus
/// In C++ a record comes with its size; in C the caller fills it in.
#define MW_SIZE_OF(record) = sizeof(record)
#else
#define MW_SIZE_OF(record)
#endif

#ifdef __cplusplus
extern "C" {
#endif
#pragma GCC visibility push(default)

/// Where a file is in its life.
enum {
    kWriterFileWriting = 1, ///< Pictures and sound are being taken.
    /// Closed by the engine; the rest is being encoded, the index written, the file synced.
    kWriterFileFinishing = 2,
    kWriterFileComplete = 3, ///< Complete, on the disk, under its real name.
    kWriterFileFailed = 4,   ///< Not complete and never will be; see nError. The real name was not touched.
    /// Closed without having received anything: removed, without an error. The real name was not touched.
    kWriterFileEmpty = 5
};

/// What went wrong.
enum {
    kWriterErrorNone = 0,
    kWriterErrorArgument = 1, ///< The parameters make no sense: no name, no stream, a negative size.
    kWriterErrorFormat = 2,   ///< The file format is not in the table.
    kWriterErrorCodec = 3,   ///< The format cannot carry the codec, or this build of FFmpeg cannot encode it.
    kWriterErrorExists = 4,  ///< The target exists and is not to be replaced, or is being written already.
    kWriterErrorOpen = 5,    ///< The temporary file could not be created; see nSystemError.
    kWriterErrorNoSpace = 6, ///< The disk or the quota is full.
    kWriterErrorWrite = 7,   ///< Another write failure; see nSystemError.
    kWriterErrorEncode = 8,  ///< An encoder or the multiplexer refused its input.
    kWriterErrorFinish = 9,  ///< Everything was written, but syncing or renaming failed; see nSystemError.
    kWriterErrorInternal = 10, ///< Out of memory, or a fault of the writer.
    kWriterErrorRefused = 11   ///< None of the pictures, or none of the sound, could be taken as it was.
};

enum {
    kWriterDefaultSet = 0, ///< Always registered.
    kWriterSetWord = 0     ///< The word of EncodeParam::nReserved that holds the number of a set.
};

enum { kWriterTextSize = 512, kWriterPathSize = 4096 };

/// One output file, as it stands. Lengths are in seconds, sizes in bytes, samples in sample frames (one per
/// channel).
typedef struct WriterStatus {
    uint32_t nSize MW_SIZE_OF(WriterStatus); ///< Size of this record in bytes.
    uint32_t nSet;                           ///< The set of options that the file was created with.
    int32_t nSequence;    ///< Number of the file in its set, from 1, in the order of creation.
    int32_t nState;       ///< kWriterFile...
    int32_t nError;       ///< kWriterError...; the first one of this file stays.
    int32_t nSystemError; ///< errno of the failed call, 0 when the fault is not the system's.

    /// Size of the file so far (temporary or final), as far as it has left the writer.
    int64_t llBytesWritten;
    int64_t llPicturesReceived; ///< Pictures taken by MWWriteVideoFrame.
    int64_t llPicturesWritten;  ///< Pictures in the file, repeated ones counted.
    int64_t llPicturesDropped;  ///< Pictures left out because a lower frame rate was asked for.
    int64_t llPicturesRepeated; ///< Pictures shown again because a higher frame rate was asked for.
    int64_t llSamplesReceived;  ///< Sample frames taken by MWWriteAudioData, at the source's rate.
    int64_t llSamplesWritten;   ///< Sample frames in the file, at the output's rate; the codec's padding not
                                ///< counted.
    int64_t llStampsRepaired;   ///< Pictures whose stamp did not fit the sound's timeline and was put right.

    double dVideoReceived; ///< Length of the pictures taken, first to end of last, on the file's timeline.
    double dAudioReceived; ///< Length of the sound taken.
    double dVideoWritten;  ///< Length of the picture stream in the file; 0 without one.
    double dAudioWritten;  ///< Length of the sound stream in the file, without the codec's padding; 0 without
                           ///< one.
    double dFinished;      ///< While finishing, how much of it is done: 0 to 1.

    int32_t nSampleRate;   ///< Sample rate in the file: the nearest that the codec takes. 0 without sound.
    int32_t nAudioBitrate; ///< Sound bit rate in use, after the codec's limits; 0 for codecs without one.
    int32_t nWidth;        ///< Picture size in the file; 0 without pictures.
    int32_t nHeight;       ///< Likewise.

    char szWhat[kWriterTextSize];          ///< What went wrong, a sentence for users; empty when nothing did.
    char szPath[kWriterPathSize];          ///< The target as the engine named it.
    char szTemporaryPath[kWriterPathSize]; ///< Where the data is until then; empty once complete or when
                                           ///< removed.
    int64_t llBytesWaiting; ///< Of the write that a full disk has not taken yet; 0 when none waits.
} WriterStatus;

/// What a listener is told.
enum {
    kWriterEventOpened = 1,  ///< A file was created and takes pictures and sound.
    kWriterEventRefused = 2, ///< A file could not be created: MWCreateMediaFile is about to return null.
    kWriterEventFailed = 3,  ///< Writing failed; nothing more is taken. Comes once, at once.
    /// The close goes on; comes at its start and whenever dFinished has grown visibly.
    kWriterEventFinishing = 4,
    kWriterEventClosed = 5 ///< The file is complete, or the failed or empty one is closed.
};

/// Told of what happens to files. Called on the thread that calls the writer, which is the engine's worker in
/// a conversion; kWriterEventFailed may come on a thread of the writer's. It must return soon and must not
/// call back into the converter except for MCAbort.
typedef void (*WriterListener)(void* context, int event, const WriterStatus* status);

/// Asked when the disk is full. May block, for instance until there is room or the user gives up. Nonzero:
/// the same write is tried again; 0: the file fails. Called on a thread of the writer's, or on the engine's
/// worker inside MWCloseMediaFile; the engine's worker waits meanwhile as soon as the writer's queues are
/// full.
typedef int (*WriterFullDiskHandler)(void* context, const WriterStatus* status);

/// The display that HDR pictures were made for: chromaticities as in CIE 1931, luminances in cd/m2.
typedef struct WriterMasteringDisplay {
    double dRed[2];    ///< x, y
    double dGreen[2];  ///< Likewise.
    double dBlue[2];   ///< Likewise.
    double dWhite[2];  ///< Likewise.
    double dDarkest;   ///< Luminance.
    double dBrightest; ///< Luminance.
} WriterMasteringDisplay;

/// Options for files; all zero but the size is the default.
typedef struct WriterOptions {
    uint32_t nSize MW_SIZE_OF(WriterOptions); ///< Size of this record in bytes.
    int32_t nSampleAspectNum; ///< Shape of the source's pixels, width to height; 0 or 0:0 counts as 1:1.
    int32_t nSampleAspectDen; ///< The height of that proportion.
    int32_t bFullRange;       ///< Nonzero: luma covers 0 to 255, not 16 to 235.
    int32_t nColorPrimaries;  ///< As in ISO/IEC 23091-2; 0 or 2: not stated.
    int32_t nColorTransfer;   ///< As in ISO/IEC 23091-2; 0 or 2: not stated.
    int32_t nColorMatrix;     ///< As in ISO/IEC 23091-2; 0 or 2: not stated.
    /// Threads of the picture encoder. 0: one for each processor for VP8, VP9 and FFV1, two for H.264, 16 at
    /// most; else one. HEVC and AV1 use threads of their own, whatever is asked for. Their number may change
    /// the output, timing never does.
    int32_t nEncoderThreads;
    int32_t bBitExact;          ///< Nonzero: nothing in the file tells time, date or library version.
    int32_t bKeepExisting;      ///< Nonzero: a target that exists is never replaced; creating it fails.
    int32_t bRemovePartial;     ///< Nonzero: a failed file's temporary file is removed; by default it stays,
                                ///< playable.
    WriterListener pfnListener; ///< May be null.
    WriterFullDiskHandler pfnFullDisk; ///< Null: a full disk fails the file at once.
    void* pContext;                    ///< First argument of both.
    int32_t bQuality; ///< Nonzero: pictures of constant quality instead of EncodeParam's bit rate.
    /// How long the picture encoder looks for a smaller file: 1 longest to 7 shortest; 0 is 5. Codecs without
    /// such a choice ignore it.
    int32_t nSpeed;
    double dQuality;  ///< On the codec's own scale, where less is better; see MWGetQualityScale.
    int32_t nProfile; ///< Of H.264: 1 baseline, 2 main, 3 high; 0: as the encoder likes.
    /// Seconds that each file will last when that is less than the source does, as clips; 0: not known. MP4,
    /// MOV and M4A leave room for their index by it.
    double dFileLength;
    /// Bits of a picture's components: 8, which is also what 0 means, or 10 where the codec takes them; see
    /// MWGetPictureDepth. Pictures that come with another depth are brought to it.
    int32_t nDepth;
    int32_t bMasteringDisplay;               ///< Nonzero: `masteringDisplay` goes into the file.
    WriterMasteringDisplay masteringDisplay; ///< Of HDR pictures.
    int32_t nBrightestPixel;                 ///< cd/m2 of the brightest pixel of all pictures; 0: not known.
    int32_t nBrightestPicture;               ///< cd/m2, the highest average of a picture; 0: not known.
    /// Nonzero, kWriterPiece...: what is created is not the file but a piece of it, which MWJoinPieces takes.
    int32_t nPiece;
    int32_t
        bPieceContinues; ///< Nonzero: a picture of the file is shown before this piece's; see llPieceTick.
    /// Where a piece with pictures lies in the file, in 100 ns units: its first picture.
    int64_t llPieceBegin;
    int64_t llPieceEnd;  ///< The first picture of the piece that follows, -1 for the last one. Pictures from
                         ///< there on are only looked at, see MWPicturesAhead.
    int64_t llPieceTick; ///< As MWPlanTicks tells it for the piece's first picture.
    /// Nonzero: the sound that is written tells how long files are and does not go into them. Their sound are
    /// tracks (MWAddTrack).
    int32_t bSoundBeside;
    /// Nonzero: pictures come exactly at EncodeParam's rate, left out or repeated, and a rate that the codec
    /// cannot show makes the file fail. 0: a source of about that rate keeps its own times, except in MPG;
    /// and the rate becomes one that the codec has: the next one from it on for MPEG-2, 50 at most for GIF.
    int32_t bSteadyRate;
    /// The loudspeakers that the channels of the sound are for: FFmpeg's AV_CH_..., together, in whose order
    /// the channels come. 0, or another number of them than there are channels: the usual ones of that
    /// number.
    uint64_t nChannelMask;
    /// Pictures a second of a source of which the engine is told fewer, since it takes more than 200 for a
    /// mistake. A file that keeps the source's own times tells this rate, and codes by it. 0: as the engine
    /// is told.
    double dSourceRate;
} WriterOptions;

/// What a piece holds.
enum {
    kWriterPieceNone = 0,     ///< It is no piece.
    kWriterPiecePictures = 1, ///< Some of the pictures.
    /// All the rest. The pictures come without their planes: their stamps decide where the sound ends.
    kWriterPieceRest = 2
};

/// What distinguishes a file format beside what FileFormatInfo says.
enum {
    /// The file has one picture rate and knows no other times: what comes faster is left out.
    kWriterFormatSteadyRate = 1,
    kWriterFormatTags = 2,          ///< Carries texts about the movie, as many as the format knows.
    kWriterFormatChapters = 4,      ///< Carries chapters.
    kWriterFormatCover = 8,         ///< Carries a cover picture.
    kWriterFormatAttachments = 16,  ///< Carries attached files, such as fonts.
    kWriterFormatTracks = 32,       ///< Carries several tracks of sound.
    kWriterFormatLanguages = 64,    ///< Carries the languages of tracks.
    kWriterFormatTrackTitles = 128, ///< Carries the titles of tracks.
    kWriterFormatTimecode = 256,    ///< Carries a timecode, which is a text about the pictures: "timecode".
    /// Carries chapters as texts about the movie: "CHAPTER001", which is when it begins, "CHAPTER001NAME" ...
    kWriterFormatChapterTexts = 512,
    kWriterFormatCoverText = 1024,         ///< Carries what the cover is: MWDescribeCover.
    kWriterFormatNoPictureLanguage = 2048, ///< The languages that it carries are of sound and subtitles only.
    kWriterFormatSmallPackets = 4096,      ///< All is cut into small packets, whose heads take room.
    /// Holds E-AC-3 in frames of six blocks only: sound of shorter ones cannot be carried as it is.
    kWriterFormatJoinsFrames = 8192,
    /// Carries chapters, which are written when a file begins, and so on the file's timeline: see
    /// MWAddChapter.
    kWriterFormatEarlyChapters = 16384
};

/// kWriterFormat... of the format with that code, together; 0 for one that is not in the table.
uint32_t MWGetFormatTraits(uint32_t format);

/// Registers a set with these options. Returns its number, which is never kWriterDefaultSet, or 0 when
/// `options` is null, its size makes no sense, it has options that this version of the writer does not know,
/// or there is no memory.
uint32_t MWRegisterOptions(const WriterOptions* options);

/// Changes the options of a set for files created from now on; files that are open keep theirs. Returns 1; 0
/// as MWRegisterOptions does, and when there is no such set.
int MWSetOptions(uint32_t set, const WriterOptions* options);

/// Forgets a set and what became of its files. Files that are open keep their options and are finished all
/// the same; a listener is not called any more once the last file that was created with it is closed. A file
/// whose parameters name the set is refused from now on. Returns 1; 0 when there is no such set, or when it
/// is the default one.
int MWUnregisterOptions(uint32_t set);

/// Where a picture or a block of sound stands in its source: the first bytes of `reserved` in VideoImage and
/// AudioFrame, packed. A host that writes clips or a part of its source tells it, so that chapters can be
/// placed; without it, the source's time is taken for the file's.
#pragma pack(push, 4)
typedef struct WriterSourceTime {
    uint32_t nTag;  ///< kWriterSourceTimeTag.
    int64_t llTime; ///< 100 ns units from the start of the source.
} WriterSourceTime;
#pragma pack(pop)

enum { kWriterSourceTimeTag = 0x4D495453 };

/// What a movie carries beside pictures and sound. It belongs to a set and goes into each file that is
/// created with it from then on, as far as the format carries it (see MWGetFormatTraits). All of these
/// functions copy what they are given and return 1; 0 when there is no such set, the arguments make no sense,
/// or there is no memory.
///
/// A text about the movie: `key` as FFmpeg calls it, such as "title", "artist", "date", "comment",
/// "creation_time" (ISO 8601), or as the format has it. Null or an empty value takes the text away.
int MWSetTag(uint32_t set, const char* key, const char* value);

/// 1 when files of the format hold that text, which they may not for its key or its length; else 0.
int MWCarriesTag(uint32_t format, const char* key, const char* value);

/// Numbers of tracks: the engine's pictures, its sound, and from there on those that are added.
enum { kWriterTrackPictures = 0, kWriterTrackSound = 1, kWriterTrackFurther = 2 };

/// The same about a track, such as "language" (ISO 639-2), "title", or "language_tag" (BCP 47 with a region
/// or a script, "pt-BR") beside the language.
int MWSetTrackTag(uint32_t set, int track, const char* key, const char* value);

/// 1 when files of the format hold that text about a track: a format can have names of its own for some
/// languages, and none for others. Else 0.
int MWCarriesTrackTag(uint32_t format, const char* key, const char* value);

/// What a track is for: FFmpeg's AV_DISPOSITION_..., together.
int MWSetTrackFlags(uint32_t set, int track, int flags);

/// Those of these flags that files of the format hold, beside AV_DISPOSITION_DEFAULT; 0 without such a
/// format.
int MWCarriedTrackFlags(uint32_t format);

struct AVCodecParameters;
struct AVPacket;
struct AudioFrame;

/// A block of sound or a packet of a track.
typedef struct WriterTrackItem {
    const struct AudioFrame* pSound; ///< PCM, or null.
    const struct AVPacket* pPacket;  ///< FFmpeg's, whose own times are not looked at; or null.
    int64_t llTime;                  ///< 100 ns units from the start of the source.
    int64_t llDuration;              ///< 100 ns units; 0 for a packet that lasts up to the next one.
} WriterTrackItem;

/// Asks the host for the next item of a track, which begins before `until` in the source. 0 when there is
/// none at hand: it is asked again when the file has come further; `item->llTime` is then where the next one
/// begins at the earliest. For `closing` the file ends there, and the host waits for its source until it is
/// sure; it may know better than `until` where that end is. Items come in their order, sound without gaps,
/// and stay valid until the next call. Called on one thread of the writer's at a time, for one file after the
/// other.
typedef int (*WriterTrackReader)(void* context, int64_t until, int closing, WriterTrackItem* item);

/// A track beside the engine's pictures and sound. Its source is asked, as the file grows, for what belongs
/// to the part that has been written.
typedef struct WriterTrack {
    uint32_t nSize MW_SIZE_OF(WriterTrack); ///< Size of this record in bytes.
    /// Sound to encode with the codec of EncodeParam, as it is to be in the file: samples per second,
    /// channels, bits a sample, bits per second. 0 for packets, which have parameters instead.
    int32_t nSampleRate;
    int32_t nChannels;      ///< Likewise.
    int32_t nBitsPerSample; ///< Likewise.
    int32_t nBitrate;       ///< Likewise; 0 or less: as in EncodeParam.
    /// FFmpeg's, of the version that the writer uses; or null. Of sound, `initial_padding` tells the samples
    /// that decoders leave out at the begin of the set's first file.
    const struct AVCodecParameters* pParameters;
    WriterTrackReader pfnNext; ///< Asked for its items.
    void* pContext; ///< Its first argument. Both have to last until the last file of the set is closed.
    uint64_t nChannelMask; ///< Of sound to encode, as in WriterOptions.
} WriterTrack;

/// Adds a track. Its number is the next one from kWriterTrackFurther on. Formats without kWriterFormatTracks
/// leave out sound, formats that do not carry the codec (MWCarriesPackets) packets.
int MWAddTrack(uint32_t set, const WriterTrack* track);

/// Texts of a track of subtitles that were not fit to be converted, and are in none of the set's files. 0
/// without such a track.
int64_t MWGetLostCues(uint32_t set, int track);

/// 1 when files of the format carry packets of the codec with that name of FFmpeg's as a track: sound and
/// subtitles as they are, or subtitles of text as other ones. Else 0.
int MWCarriesPackets(uint32_t format, const char* codec);

/// 100 ns units. No file gets less of a chapter: a cut may lie beside a chapter's border by as much.
enum { kWriterShortestChapter = 10000 };

/// A chapter, in the source's time (100 ns units). Each file gets what lies in it, on its own timeline, when
/// it is closed, unless that is shorter than kWriterShortestChapter. Formats of kWriterFormatEarlyChapters
/// get it as it is, so that its times are the file's. `title` may be null.
int MWAddChapter(uint32_t set, int64_t begin, int64_t end, const char* title);

/// A cover, as JPEG or PNG; a second call replaces it. In MP4, MOV and M4A it comes with the close.
int MWSetCover(uint32_t set, const void* data, int64_t size);

/// The name of the cover's file, where it is an attached one (kWriterFormatAttachments), and what it is, for
/// people (kWriterFormatCoverText). Null or an empty text: "cover.jpg" or "cover.png", and nothing. 0 without
/// a cover.
int MWDescribeCover(uint32_t set, const char* fileName, const char* description);

/// An attached file.
int MWAddAttachment(uint32_t set, const char* fileName, const char* mimeType, const void* data, int64_t size);

/// What the file attached last is, for people; null or an empty text takes that away. MKV holds it.
int MWDescribeAttachment(uint32_t set, const char* description);

/// Files of the set created so far, refused ones counted: the highest sequence number. 0 without such a set.
int MWGetFileCount(uint32_t set);

/// Copies how file `sequence` of the set stands. Open files and the last 64 others are remembered. Returns 1;
/// 0 when the set or the file is not known (any more), or `status` is null or its size makes no sense.
int MWGetFileStatus(uint32_t set, int sequence, WriterStatus* status);

/// Copies the latest remembered status of the set that carries an error. Returns 1; 0 when none of its files
/// has failed, and as MWGetFileStatus does.
int MWGetLastFailure(uint32_t set, WriterStatus* status);

/// Copies how the file stands that the calling thread created last, a refused one included, or has closed
/// since. Returns 1; 0 when there is none or `status` is null or its size makes no sense.
int MWGetThreadFileStatus(WriterStatus* status);

/// The ticks of a file's pictures, by which a piece goes on where another one ends: for each of `count`
/// rising times in the file (100 ns units, the first is 0) that of the picture shown last before it, or
/// kWriterNoTick. The parameters are those of MWCreateMediaFile, whose options count as well. Returns 1; 0
/// when they make no sense or there is no memory.
int MWPlanTicks(const EncodeParam* param, const VideoFormat* video, const int64_t* times, int64_t count,
                int64_t* ticks);

#define kWriterNoTick INT64_MIN ///< No picture is shown before this one.

/// Sound as it is going to be in a file.
typedef struct WriterSound {
    uint32_t nSize MW_SIZE_OF(WriterSound); ///< Size of this record in bytes.
    int32_t nSampleRate;                    ///< Samples per second.
    int32_t nChannels;                      ///< Channel count.
    uint64_t nChannelMask;                  ///< As in WriterOptions.
} WriterSound;

/// What the format and the codec of `param` make of the sound, of which `sound` tells the channel mask.
/// Returns 1; 0 when the parameters make no sense, or there is no encoder or no memory.
int MWPlanSound(const EncodeParam* param, const AudioFormat* audio, WriterSound* sound);

/// How many pictures behind the end of a piece are to be written into it as well, where there are that many:
/// its encoder looks at them, so that the last pictures of the piece get the bits that they get in an
/// undivided file. None of them is in the piece. `codec` as in EncodeParam, `speed` as in WriterOptions.
/// 0 when the encoder looks at none, or there is no such codec or speed.
int MWPicturesAhead(uint32_t codec, int speed);

/// What MWJoinPieces makes a file of.
typedef struct WriterJoin {
    uint32_t nSize MW_SIZE_OF(WriterJoin); ///< Size of this record in bytes.
    int32_t nPieces;                       ///< Paths in `pszPieces`.
    /// Paths of the pieces: those with pictures in their order, then the rest.
    const char* const* pszPieces;
    int64_t llSourceBegin; ///< Where the file's first picture stands in the source, in 100 ns units.
    /// Told the share done, 0 to 1, now and then. 0 ends the work, and the file fails. May be null.
    int (*pfnGoesOn)(void* context, double share);
    void* pContext; ///< The first argument of `pfnGoesOn`.
} WriterJoin;

/// Makes one file of pieces, as MWCreateMediaFile and all that follows would have made it: the listener hears
/// of it in the same way. Returns 1 when it is complete under its name.
int MWJoinPieces(const wchar_t* fileName, const EncodeParam* param, const VideoFormat* video,
                 const AudioFormat* audio, const WriterJoin* join);

/// The writer's version, as MC_MAKE_VERSION makes it. An engine of another major version refuses the writer.
unsigned MWGetVersion(void);

/// Nonzero: FFmpeg's lines go to the log function that the engine has been given, from all of the process's
/// uses of its libraries. Zero: they are shown as FFmpeg does it by itself. The engine calls this.
void MWForwardLog(int forward);

/// The table's code of a codec for pictures (`forSound` 0) or sound that files of `format` can carry and this
/// build of FFmpeg can encode, asked for by any of its names; 0 when there is none.
uint32_t MWFindCodec(uint32_t format, uint32_t code, int forSound);

/// The scale of a picture codec's constant quality, from the best figure to the worst. Returns 1; 0 when the
/// codec has none or is not known, or a place for the figures is null.
int MWGetQualityScale(uint32_t code, double* best, double* worst);

/// Most bits of a component that a picture codec can be given, 8 or 10; 0 when it is not known.
int MWGetPictureDepth(uint32_t code);

#pragma GCC visibility pop
#undef MW_SIZE_OF
#ifdef __cplusplus
}
#endif

#endif
