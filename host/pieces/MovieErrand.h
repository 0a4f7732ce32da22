// One movie of many being converted: what is told of it names it, and the journal hears of it.
#ifndef MOVIECONV_HOST_PIECES_MOVIEERRAND_H
#define MOVIECONV_HOST_PIECES_MOVIEERRAND_H

#include "host/convert/Outlet.h"
#include "host/pieces/BatchJournal.h"
#include "host/pieces/Crew.h"
#include "host/pieces/FileLock.h"

#include <atomic>
#include <optional>
#include <string>
#include <utility>

namespace movieconv {

class MovieErrand final : public Errand {
public:
    /// `opened`: files of all movies so far.
    MovieErrand(Outlet& news, BatchJournal& journal, std::atomic<int>& opened, const Request& request,
                SourceMark source, const std::string& settings)
        : news_(news),
          journal_(journal),
          opened_(opened),
          input_(request.input),
          output_(request.output),
          source_(std::move(source)),
          settings_(settings) {}

    void Opened(const OpenedFile& news) override {
        lock_.emplace(news.temporaryPath);
        journal_.NoteBegun(output_, source_, settings_, news.temporaryPath);
        number_ = ++opened_;
        OpenedFile named = news;
        named.number = number_;
        named.input = input_;
        news_.Opened(named);
    }
    void Closed(const ClosedFile& news) override {
        ClosedFile named = news;
        named.number = number_;
        named.input = input_;
        news_.Closed(named);
    }
    void Warned(const Warning& news) override { news_.Warned({news.kind, news.text, input_}); }
    void LeftBehind(const NotCarried& news) override {
        NotCarried named = news;
        named.input = input_;
        news_.LeftBehind(named);
    }
    void Conclude(Verdict& verdict) override {
        if (verdict.outcome == Outcome::kDone)
            journal_.NoteDone(output_, source_, settings_);
    }

private:
    Outlet& news_;
    BatchJournal& journal_;
    std::atomic<int>& opened_;
    const std::string input_;
    const std::string output_;
    const SourceMark source_;
    const std::string& settings_;
    int number_ = 0;
    std::optional<FileLock> lock_; // by which other runs see that the file is being written
};

} // namespace movieconv

#endif
