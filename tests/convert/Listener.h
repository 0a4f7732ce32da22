// Hears a conversion and keeps what it was told.
#ifndef MOVIECONV_TESTS_CONVERT_LISTENER_H
#define MOVIECONV_TESTS_CONVERT_LISTENER_H

#include "host/convert/Job.h"

#include <functional>
#include <string>
#include <thread>
#include <vector>

/// To be read once the job has ended.
class Listener final : public movieconv::Observer {
public:
    std::function<void(const movieconv::Progress&)> onProgress;
    std::function<void(const movieconv::OpenedFile&)> onOpened;
    std::function<void(const movieconv::ClosedFile&)> onClosed;

    int starts = 0;
    int ends = 0;
    std::vector<movieconv::Phase> phases; // each change
    std::vector<std::string> opened;
    std::vector<std::string> closed;
    std::vector<movieconv::Warning> warnings;
    std::vector<movieconv::NotCarried> left;
    std::vector<std::shared_ptr<const movieconv::ShownPicture>> pictures;
    std::vector<std::thread::id> threads; // one for each of the above

    void Started(const movieconv::Start&) override {
        ++starts;
        Note();
    }
    void Progressed(const movieconv::Progress& news) override {
        if (news.phaseChanged)
            phases.push_back(news.phase);
        if (onProgress)
            onProgress(news);
        Note();
    }
    void Opened(const movieconv::OpenedFile& news) override {
        opened.push_back(news.path);
        if (onOpened)
            onOpened(news);
        Note();
    }
    void Closed(const movieconv::ClosedFile& news) override {
        closed.push_back(news.path);
        if (onClosed)
            onClosed(news);
        Note();
    }
    void Warned(const movieconv::Warning& news) override {
        warnings.push_back(news);
        Note();
    }
    void LeftBehind(const movieconv::NotCarried& news) override {
        left.push_back(news);
        Note();
    }
    void Showed(const std::shared_ptr<const movieconv::ShownPicture>& news) override {
        pictures.push_back(news);
        Note();
    }
    void Ended(const movieconv::Verdict&) override {
        ++ends;
        Note();
    }

private:
    void Note() { threads.push_back(std::this_thread::get_id()); }
};

/// Converts on its own.
inline movieconv::Verdict Convert(const movieconv::Request& request, Listener& listener) {
    movieconv::Job job(request, listener);
    job.Start();
    job.Wait();
    return *job.Result();
}

#endif
