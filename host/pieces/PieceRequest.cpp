#include "host/pieces/PieceRequest.h"

#include "host/source/MediaTime.h"

#include <cstddef>

namespace movieconv {

Request WholeRequest(const Plan& plan) {
    Request request = plan.settings;
    request.input = plan.source.path;
    request.output = plan.output;
    return request;
}

Request RequestFor(const Plan& plan, int number, const std::string& output) {
    Request request = WholeRequest(plan);
    request.output = output;
    request.overwrite = true; // whatever was left there
    request.keepPartial = false;
    request.maxSize.reset();    // the rates are chosen for it
    request.encoderThreads = 1; // more of them may change the bytes from run to run
    PieceCut cut;
    cut.pictures = !plan.IsRest(number);
    cut.origin = plan.pictures.front().begin;
    cut.fromStart = plan.fromStart;
    if (cut.pictures) {
        const auto place = static_cast<std::size_t>(number);
        const Piece& piece = plan.pictures[place];
        cut.begin = piece.begin;
        cut.end = piece.end;
        cut.until = piece.until;
        cut.last = place + 1 == plan.pictures.size();
        cut.tick = piece.tick;
        cut.drawnSince = piece.drawnSince;
        if (number > 0)
            request.begin = ToSeconds(piece.begin);
        request.length = ToSeconds(piece.until - piece.begin);
    }
    request.piece = cut;
    return request;
}

} // namespace movieconv
