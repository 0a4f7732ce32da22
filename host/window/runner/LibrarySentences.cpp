#include "host/window/runner/LibrarySentences.h"

#include <QtGlobal>

namespace movieconv::window {
namespace {

constexpr const char* kSentences[] = {
    // What is told of a file.
    QT_TRANSLATE_NOOP("Library", "“%1”: %2"),

    // Why something stays behind.
    QT_TRANSLATE_NOOP("Library", "%1 cannot hold them, MKV can"),
    QT_TRANSLATE_NOOP("Library", "%1 cannot hold them"),
    QT_TRANSLATE_NOOP("Library", "%1 cannot hold it as it is"),
    QT_TRANSLATE_NOOP("Library", "%1 cannot hold it"), QT_TRANSLATE_NOOP("Library", "%1 cannot hold its %2"),

    QT_TRANSLATE_NOOP("Library", "%1 cannot hold one of %2 bytes"),
    QT_TRANSLATE_NOOP("Library", "%1 holds one track of sound, MKV and MP4 hold several"),
    QT_TRANSLATE_NOOP("Library", "%1 of them have no length"),
    QT_TRANSLATE_NOOP("Library", "it cannot be decoded"),
    QT_TRANSLATE_NOOP("Library", "it belongs to another programme"),
    QT_TRANSLATE_NOOP("Library", "one stream of pictures is converted"),
    QT_TRANSLATE_NOOP("Library", "data streams are not converted"),
    QT_TRANSLATE_NOOP("Library", "only one cover is carried"),
    QT_TRANSLATE_NOOP("Library", "it is neither JPEG nor PNG"),
    QT_TRANSLATE_NOOP("Library", "it has no name or no content"),
    QT_TRANSLATE_NOOP("Library", "it belongs to the pictures"),
    QT_TRANSLATE_NOOP("Library", "“%1” makes no sense"),
    QT_TRANSLATE_NOOP("Library", "one of their texts could not be converted"),
    QT_TRANSLATE_NOOP("Library", "%1 of their texts could not be converted"),
    QT_TRANSLATE_NOOP("Library", "%1 of them are in other editions or within others"),
    QT_TRANSLATE_NOOP("Library", "%1 of them have titles in further languages"),
    QT_TRANSLATE_NOOP("Library", "%1 of them are out of their order in time"),
    QT_TRANSLATE_NOOP("Library", "%1 of them lie outside the movie"),
    QT_TRANSLATE_NOOP("Library", "of their texts only the titles are carried, not %1"),

    // Why a conversion is refused.
    QT_TRANSLATE_NOOP("Library", "%1 cannot hold “%2” sound as it is; no format can"),
    QT_TRANSLATE_NOOP("Library", "%1 cannot hold “%2” sound as it is; %3 can"),
    QT_TRANSLATE_NOOP("Library", "%1 cannot hold short frames of “%2” sound as it is; MKV can"),
    QT_TRANSLATE_NOOP("Library", "%1 cannot begin the sound as it is %2 s behind the pictures; MKV can"),
    QT_TRANSLATE_NOOP("Library", "its sound has no form that could be copied; convert it instead"),
    QT_TRANSLATE_NOOP("Library",
                      "its sound changes its form there and cannot be copied on; convert it instead"),
    QT_TRANSLATE_NOOP("Library", "%1 cannot carry pictures as “%2”"),
    QT_TRANSLATE_NOOP("Library", "%1 cannot carry sound as “%2”"),
    QT_TRANSLATE_NOOP("Library", "%1 carries nothing that “%2” holds; choose another format"),
    QT_TRANSLATE_NOOP("Library", "there is no file format “%1”"),
    QT_TRANSLATE_NOOP("Library", "the extension of “%1” tells no file format"),
    QT_TRANSLATE_NOOP("Library", "“%1” has no constant quality; give it a bit rate"),
    QT_TRANSLATE_NOOP("Library", "the quality of “%1” goes from %2 (best) to %3, not to %4"),
    QT_TRANSLATE_NOOP("Library", "the begin, %1 s, is not before the end of “%2”, which is %3 s long"),
    QT_TRANSLATE_NOOP("Library", "“%1” has pictures of %2 bits; HEVC, VP90 and AV01 have some of 10"),
    QT_TRANSLATE_NOOP("Library", "HDR needs pictures of 10 bits; “%1” has 8 here"),
    QT_TRANSLATE_NOOP("Library", "too little is left of the pictures of “%1”, which are %2x%3"),
    QT_TRANSLATE_NOOP("Library", "there is no sound “%1”; there is: %2"),
    QT_TRANSLATE_NOOP("Library", "there are no subtitles “%1”; there are: %2"),
    QT_TRANSLATE_NOOP("Library", "there are no pictures in the output to draw subtitles into"),
    QT_TRANSLATE_NOOP("Library", "there are no pictures to draw subtitles into"),
    QT_TRANSLATE_NOOP("Library", "a split needs pictures: sound alone is written as one file"),
    QT_TRANSLATE_NOOP("Library", "“%1” does not tell how long it is"),

    // What is wrong with the place of an output.
    QT_TRANSLATE_NOOP("Library", "“%1” is the source itself; give the output another name"),
    QT_TRANSLATE_NOOP("Library", "“%1” is a file of subtitles that is read; give the output another name"),
    QT_TRANSLATE_NOOP("Library", "“%1” is a folder; name a file in it"),
    QT_TRANSLATE_NOOP("Library", "“%1” is not a file but a device or a pipe; name a file"),
    QT_TRANSLATE_NOOP("Library", "“%1” is a link to a missing file; name that file, or remove the link"),
    QT_TRANSLATE_NOOP("Library", "“%1” is not a folder"), QT_TRANSLATE_NOOP("Library", "“%1” exists"),
    QT_TRANSLATE_NOOP("Library", "the output's folder “%1” cannot be used: %2"),
    QT_TRANSLATE_NOOP("Library", "cannot create files in “%1”: %2; choose another folder"),
    QT_TRANSLATE_NOOP("Library", "the name of a split output needs an extension, as in “%1”"),
    QT_TRANSLATE_NOOP("Library", "the name “%1” is too long to number clips; choose a shorter one"),
    QT_TRANSLATE_NOOP("Library", "the name “%1” is too long for its file system; choose a shorter one"),

    // What goes wrong with a source.
    QT_TRANSLATE_NOOP("Library", "“%1” holds nothing to convert"),
    QT_TRANSLATE_NOOP("Library", "“%1” holds no pictures and no sound that can be decoded"),
    QT_TRANSLATE_NOOP("Library", "“%1” holds no pictures that can be decoded"),
    QT_TRANSLATE_NOOP("Library", "“%1” holds no sound that can be decoded"),
    QT_TRANSLATE_NOOP("Library", "cannot open “%1”: %2"),
    QT_TRANSLATE_NOOP("Library", "cannot read “%1” from its start again"),
    QT_TRANSLATE_NOOP("Library", "cannot read “%1”: %2"),
    QT_TRANSLATE_NOOP("Library", "cannot read the streams of “%1”: %2"),
    QT_TRANSLATE_NOOP("Library", "cannot start the decoder %1: %2"),
    QT_TRANSLATE_NOOP("Library", "it is not a movie, or its index is missing because it was never finished"),
    QT_TRANSLATE_NOOP("Library", "it asks for more memory than there is"),
    QT_TRANSLATE_NOOP("Library", "it is a text, not a movie"),
    QT_TRANSLATE_NOOP("Library", "it is not a movie, but says where to find one"),
    QT_TRANSLATE_NOOP("Library", "it is a playlist, which names other files"),
    QT_TRANSLATE_NOOP("Library", "it names “%1” over and over"),
    QT_TRANSLATE_NOOP("Library", "it names “%1”: %2"),
    QT_TRANSLATE_NOOP("Library", "it names “%1”, another file"),
    QT_TRANSLATE_NOOP("Library", "it names “%1”, which is not a file's name"),
    QT_TRANSLATE_NOOP("Library", "it names “%1”, which does not exist"),
    QT_TRANSLATE_NOOP("Library", "it names “%1”, which lies outside its folder"),
    QT_TRANSLATE_NOOP("Library", "it names “%1”, which is no regular file"),
    QT_TRANSLATE_NOOP("Library", "“%1” has changed meanwhile"),
    QT_TRANSLATE_NOOP("Library", "its borders cannot be looked for: %1"),
    QT_TRANSLATE_NOOP("Library", "its pictures cannot be filtered: %1"),
    QT_TRANSLATE_NOOP("Library",
                      "its HDR pictures with the colour matrix “%1” cannot be brought to BT.709: %2"),
    QT_TRANSLATE_NOOP("Library", "reading “%1” failed after %2: %3; what was read is converted"),
    QT_TRANSLATE_NOOP("Library", "reading “%1” failed after %2: %3"),
    QT_TRANSLATE_NOOP("Library", "the file was cut meanwhile"),
    QT_TRANSLATE_NOOP("Library", "it is cut off: it ends at %1 although it announces %2"),
    QT_TRANSLATE_NOOP("Library", "it ends at %1 although it announces %2"),
    QT_TRANSLATE_NOOP("Library", "it is cut off"),
    QT_TRANSLATE_NOOP("Library", "it cannot be read from its start again"),

    // What goes wrong with subtitles.
    QT_TRANSLATE_NOOP("Library", "the subtitles “%1” cannot be decoded"),
    QT_TRANSLATE_NOOP("Library", "the subtitles cannot be decoded: %1"),
    QT_TRANSLATE_NOOP("Library", "the subtitles cannot be drawn: %1"),
    QT_TRANSLATE_NOOP("Library", "the subtitles of a pipe cannot be drawn into its pictures"),
    QT_TRANSLATE_NOOP("Library", "the subtitles %1 are not there any more"),
    QT_TRANSLATE_NOOP("Library", "the subtitles cannot be read ahead of the pictures"),
    QT_TRANSLATE_NOOP("Library", "cannot make a folder for the subtitles: %1"),
    QT_TRANSLATE_NOOP("Library", "cannot write the subtitles to “%1”"),
    QT_TRANSLATE_NOOP("Library", "cannot read subtitles from “%1”: %2"),
    QT_TRANSLATE_NOOP("Library", "it holds none of text"),
    QT_TRANSLATE_NOOP("Library", "it is too large for subtitles"),
    QT_TRANSLATE_NOOP("Library", "input failed"),

    QT_TRANSLATE_NOOP("Library", "it is not in the character set “%1”"),
    QT_TRANSLATE_NOOP("Library", "there is no character set “%1”"),

    // What goes wrong with an output.
    QT_TRANSLATE_NOOP("Library", "cannot write “%1”: %2; what was written so far is in “%3”"),
    QT_TRANSLATE_NOOP("Library", "cannot write “%1”: %2"),
    QT_TRANSLATE_NOOP("Library", "%1; %2 were written, %3 are free: make room or choose another disk"),
    QT_TRANSLATE_NOOP("Library", "Writing to “%1” failed after %2 bytes: %3"),
    QT_TRANSLATE_NOOP("Library", "Syncing “%1” failed: %2"),
    QT_TRANSLATE_NOOP("Library", "Renaming “%1” failed: %2"),
    QT_TRANSLATE_NOOP("Library", "No file can be created in the folder “%1”: %2"),
    QT_TRANSLATE_NOOP("Library", "Another conversion is writing this file (%1)"),
    QT_TRANSLATE_NOOP("Library", "The file exists already (%1)"),
    QT_TRANSLATE_NOOP("Library", "The encoder for “%1” does not accept %2: %3"),
    QT_TRANSLATE_NOOP("Library", "The encoder %1 failed: %2"),
    QT_TRANSLATE_NOOP("Library", "Pictures of %1x%2 cannot be written; choose another size"),
    QT_TRANSLATE_NOOP("Library", "There is not enough memory"),
    QT_TRANSLATE_NOOP("Library", "No thread can be started: %1"),
    QT_TRANSLATE_NOOP("Library", "the media writer gave no reason"),
    QT_TRANSLATE_NOOP("Library", "“%1” vanished while it was written: %2"),
    QT_TRANSLATE_NOOP("Library", "“%1” was written but stands there no more: it vanished meanwhile"),
    QT_TRANSLATE_NOOP("Library", "“%1” was written, but another file stands there now"),
    QT_TRANSLATE_NOOP("Library", "“%1” holds %2 s of pictures, but %3 s were sent into it"),
    QT_TRANSLATE_NOOP("Library", "“%1” holds %2 s of sound, but %3 s were sent into it"),
    QT_TRANSLATE_NOOP("Library", "“%1” has %2 bytes, but %3 were written into it"),
    QT_TRANSLATE_NOOP("Library", "“%1” has become larger than asked for: %2"),

    // What goes wrong with the machine.
    QT_TRANSLATE_NOOP("Library", "the conversion broke off after %1, for want of memory"),
    QT_TRANSLATE_NOOP("Library", "the conversion broke off after %1"),
    QT_TRANSLATE_NOOP("Library", "the conversion could not be started"),
    QT_TRANSLATE_NOOP("Library", "no thread could be started for the conversion"),
    QT_TRANSLATE_NOOP("Library", "no thread can be started: %1"),
    QT_TRANSLATE_NOOP("Library", "no memory for the converter"), QT_TRANSLATE_NOOP("Library", "no memory"),
    QT_TRANSLATE_NOOP("Library", "Invalid data found when processing input"),
    QT_TRANSLATE_NOOP("Library", "Generic error in an external library"),
    QT_TRANSLATE_NOOP("Library", "Unknown error occurred"),

    // What is told on the way.
    QT_TRANSLATE_NOOP("Library", "“%1” needs about %2 to %3 more, but only %4 are free"),
    QT_TRANSLATE_NOOP("Library", "“%1” needs about %2, but only %3 are free"),
    QT_TRANSLATE_NOOP("Library", "no space is left for “%1”; waiting until there is room for %2"),
    QT_TRANSLATE_NOOP("Library", "no black borders were found"),
    QT_TRANSLATE_NOOP("Library", "black borders cannot be looked for in a pipe"),
    QT_TRANSLATE_NOOP("Library", "the pictures are cropped to %1x%2: %3 above, %4 below, %5 left, %6 right"),

    // What of the source was put right or left out.
    QT_TRANSLATE_NOOP("Library", "1 of its subtitles was not in UTF-8 and taken for Windows-1252"),
    QT_TRANSLATE_NOOP("Library", "%1 of its subtitles were not in UTF-8 and taken for Windows-1252"),
    QT_TRANSLATE_NOOP("Library", "interlaced pictures were made progressive"),
    QT_TRANSLATE_NOOP("Library", "its HDR pictures were brought to the light and colours of BT.709"),
    QT_TRANSLATE_NOOP("Library", "interlaced pictures stayed as they are, in files that do not tell it"),
    QT_TRANSLATE_NOOP("Library", "its pictures of %1 bits got 8"),
    QT_TRANSLATE_NOOP("Library", "its pictures of %1 bits got 10"),
    QT_TRANSLATE_NOOP("Library", "its %1 sound became %2"),
    QT_TRANSLATE_NOOP("Library", "its sound of %1 Hz got %2"),
    QT_TRANSLATE_NOOP("Library", "its sound of %1 channels got %2"),
    QT_TRANSLATE_NOOP("Library", "its %1 pictures keep their colours at half the resolution (4:2:0)"),
    QT_TRANSLATE_NOOP("Library", "the transparency of its pictures was left out"),
    QT_TRANSLATE_NOOP("Library", "what Dolby Vision adds to its pictures was left out"),
    QT_TRANSLATE_NOOP("Library", "its colours are made for Dolby Vision alone, and are wrong without it"),
    QT_TRANSLATE_NOOP("Library", "its closed captions were left out"),
    QT_TRANSLATE_NOOP("Library", "pictures for both eyes stayed as they are, in files that do not tell it"),
    QT_TRANSLATE_NOOP("Library", "spherical pictures stayed as they are, in files that do not tell it"),
    QT_TRANSLATE_NOOP("Library", "the source's clock jumped once; the parts were joined"),
    QT_TRANSLATE_NOOP("Library", "the source's clock jumped %1 times; the parts were joined"),
    QT_TRANSLATE_NOOP("Library", "%1 damaged pieces of picture data were skipped"),
    QT_TRANSLATE_NOOP("Library", "%1 damaged pieces of sound data were skipped"),
    QT_TRANSLATE_NOOP("Library", "%1 pictures had a missing or falling time stamp"),
    QT_TRANSLATE_NOOP("Library", "the sound had %1 gaps or overlaps, which were closed"),
    QT_TRANSLATE_NOOP("Library", "some of its pictures have %1x%2 and were fitted into those of %3x%4"),
    QT_TRANSLATE_NOOP("Library", "some of its sound has %1 channels and got %2"),
    QT_TRANSLATE_NOOP("Library", "%1 damaged pieces of sound data were skipped in stream %2"),
    QT_TRANSLATE_NOOP("Library", "the sound of stream %1 had %2 gaps or overlaps, which were closed"),
    QT_TRANSLATE_NOOP("Library", "pictures of %1 s, which the source announces only at %2 s, were left out"),
    QT_TRANSLATE_NOOP("Library", "sound of %1 s, which the source announces only at %2 s, was left out"),

    // What is wrong with a preset.
    QT_TRANSLATE_NOOP("Library", "%1: the parent “%2” has this preset as a parent itself"),
    QT_TRANSLATE_NOOP("Library", "%1: there is no preset “%2”"),
    QT_TRANSLATE_NOOP("Library", "there is no preset “%1”"),
    QT_TRANSLATE_NOOP("Library", "%1: “%2” is there twice"),
    QT_TRANSLATE_NOOP("Library", "%1: this is no JSON: %2"),
    QT_TRANSLATE_NOOP("Library", "%1:1: a preset is a JSON object, in braces"),

    QT_TRANSLATE_NOOP("Library", "%1: this is nested too deep for a preset"),
    QT_TRANSLATE_NOOP("Library", "cannot read the preset “%1”: %2"),
    QT_TRANSLATE_NOOP("Library", "“%1” is too large for a preset"),
    QT_TRANSLATE_NOOP("Library", "a preset has a name"),
    QT_TRANSLATE_NOOP("Library", "%1: “%2” has to be %3"), QT_TRANSLATE_NOOP("Library", "a text"),
    QT_TRANSLATE_NOOP("Library", "the name of a preset, or null"),
    QT_TRANSLATE_NOOP("Library", "a format's code or extension"),
    QT_TRANSLATE_NOOP("Library", "an object, in braces"),
    QT_TRANSLATE_NOOP("Library", "a codec's code of up to four characters, or a list of them"),
    QT_TRANSLATE_NOOP("Library", "a number from 0 to 63, or such numbers by picture height or codec"),
    QT_TRANSLATE_NOOP("Library", "a bit rate such as “%1”, or such rates by number of channels"),
    QT_TRANSLATE_NOOP("Library", "a bit rate such as “%1”"),
    QT_TRANSLATE_NOOP("Library", "a frame rate up to %1, such as 25 or “%2”"),
    QT_TRANSLATE_NOOP("Library", "slowest, slower, slow, medium, fast, faster or fastest"),
    QT_TRANSLATE_NOOP("Library", "baseline, main or high"),
    QT_TRANSLATE_NOOP("Library", "a size such as “%1”"), QT_TRANSLATE_NOOP("Library", "true or false"),
    QT_TRANSLATE_NOOP("Library", "a number from 1 to 8"),
    QT_TRANSLATE_NOOP("Library", "a number from 4000 to 384000"),
    QT_TRANSLATE_NOOP("Library", "%1: there is no “%2” in presets; it has no effect"),

    // Texts that stay behind: after all that begins likewise.
    QT_TRANSLATE_NOOP("Library", "%1 cannot hold %2")};

constexpr const char* kNouns[] = {
    QT_TRANSLATE_NOOP("Library", "pictures"),  QT_TRANSLATE_NOOP("Library", "sound"),
    QT_TRANSLATE_NOOP("Library", "subtitles"), QT_TRANSLATE_NOOP("Library", "chapters"),
    QT_TRANSLATE_NOOP("Library", "cover"),     QT_TRANSLATE_NOOP("Library", "attachment"),
    QT_TRANSLATE_NOOP("Library", "data"),      QT_TRANSLATE_NOOP("Library", "tags"),
    QT_TRANSLATE_NOOP("Library", "label"),     QT_TRANSLATE_NOOP("Library", "language"),
    QT_TRANSLATE_NOOP("Library", "title"),     QT_TRANSLATE_NOOP("Library", "flags"),
    QT_TRANSLATE_NOOP("Library", "timecode"),  QT_TRANSLATE_NOOP("Library", "language as %1"),
    QT_TRANSLATE_NOOP("Library", "none")};

} // namespace

std::span<const char* const> LibrarySentences() {
    return kSentences;
}

std::span<const char* const> LibraryNouns() {
    return kNouns;
}

} // namespace movieconv::window
