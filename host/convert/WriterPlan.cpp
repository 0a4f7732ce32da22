#include "host/convert/WriterPlan.h"

#include "host/convert/CodecPlan.h"
#include "host/convert/EncodePlan.h"
#include "host/source/ColourMatrix.h"

#include <algorithm>

namespace movieconv {
namespace {

void TellColours(WriterOptions& writer, const PictureStreamInfo& pictures, bool keepsHdr) {
    constexpr int kBt709 = 1;
    const bool becomesSdr = IsHdr(pictures) && !keepsHdr;
    writer.nColorPrimaries = becomesSdr ? kBt709 : pictures.colorPrimaries;
    writer.nColorTransfer = becomesSdr ? kBt709 : pictures.colorTransfer;
    writer.nColorMatrix = HandedOutMatrix(pictures, keepsHdr);
    if (keepsHdr && pictures.masteringDisplay) {
        const MasteringDisplay& display = *pictures.masteringDisplay;
        writer.bMasteringDisplay = 1;
        std::copy_n(display.red, 2, writer.masteringDisplay.dRed);
        std::copy_n(display.green, 2, writer.masteringDisplay.dGreen);
        std::copy_n(display.blue, 2, writer.masteringDisplay.dBlue);
        std::copy_n(display.white, 2, writer.masteringDisplay.dWhite);
        writer.masteringDisplay.dDarkest = display.darkest;
        writer.masteringDisplay.dBrightest = display.brightest;
    }
    if (keepsHdr && pictures.lightLevel) {
        writer.nBrightestPixel = pictures.lightLevel->brightestPixel;
        writer.nBrightestPicture = pictures.lightLevel->brightestPicture;
    }
}

void SetPiece(WriterOptions& writer, const PieceCut& piece) {
    writer.nPiece = piece.pictures ? kWriterPiecePictures : kWriterPieceRest;
    writer.bPieceContinues = piece.tick ? 1 : 0;
    writer.llPieceTick = piece.tick.value_or(0);
    writer.llPieceBegin = piece.begin - piece.origin;
    writer.llPieceEnd = piece.last ? -1 : piece.end - piece.origin;
}

} // namespace

WriterOptions OptionsFor(const Request& request, const SourceInfo& source) {
    WriterOptions writer{};
    if (source.pictures) {
        writer.nSampleAspectNum = source.pictures->pixelAspect.num;
        writer.nSampleAspectDen = source.pictures->pixelAspect.den;
        if (source.pictures->frameRate > CredibleRate(*source.pictures))
            writer.dSourceRate = source.pictures->frameRate;
    }
    if (const FileFormatInfo& format = ChooseFormat(request); source.pictures && format.bHasVideo != 0) {
        const PictureCoding plan = PlanPictures(request, format, *source.pictures);
        writer.bQuality = plan.quality ? 1 : 0;
        writer.dQuality = plan.quality.value_or(0);
        writer.nSpeed = plan.speed ? static_cast<int32_t>(*plan.speed) : 0;
        writer.nProfile = plan.profile ? static_cast<int32_t>(*plan.profile) : 0;
        writer.nDepth = plan.depth;
        writer.bSteadyRate = plan.steadyRate ? 1 : 0;
        TellColours(writer, *source.pictures, plan.keepsHdr);
    }
    writer.bKeepExisting = request.overwrite ? 0 : 1;
    writer.bRemovePartial = request.keepPartial ? 0 : 1;
    writer.nEncoderThreads = request.encoderThreads;
    writer.bBitExact = request.bitExact ? 1 : 0;
    writer.bSoundBeside = request.copySound ? 1 : 0;
    writer.nChannelMask = source.sound ? source.sound->speakers : 0;
    writer.dFileLength = request.split.value_or(request.length.value_or(0));
    if (request.piece)
        SetPiece(writer, *request.piece);
    return writer;
}

} // namespace movieconv
