// Converts two movies at once: two_movies IN OUT IN OUT. All news comes on the main thread.
#include <movieconv/Job.h>

#include <array>
#include <condition_variable>
#include <cstdio>
#include <mutex>
#include <queue>

class MainLoop {
public:
    void Post(std::function<void()> work) {
        const std::lock_guard<std::mutex> lock(mutex_);
        work_.push(std::move(work));
        posted_.notify_one();
    }
    void RunNext() {
        std::unique_lock<std::mutex> lock(mutex_);
        posted_.wait(lock, [this] { return !work_.empty(); });
        const std::function<void()> work = std::move(work_.front());
        work_.pop();
        lock.unlock();
        work();
    }

private:
    std::mutex mutex_;
    std::condition_variable posted_;
    std::queue<std::function<void()>> work_;
};

struct Line : movieconv::Observer {
    void Progressed(const movieconv::Progress& news) override {
        std::printf("%s: %.1f s\n", name.c_str(), news.position);
    }
    void Ended(const movieconv::Verdict& news) override {
        std::printf("%s: %s\n", name.c_str(), news.failure ? news.failure->what() : "done");
        ended = true, well = !news.failure;
    }
    std::string name;
    bool ended = false, well = false;
};

int main(int argc, char** argv) {
    if (argc != 5)
        return 2;
    MainLoop loop;
    std::array<Line, 2> lines;
    std::array<std::unique_ptr<movieconv::Job>, 2> jobs;
    for (std::size_t i = 0; i < jobs.size(); ++i) {
        movieconv::Request request;
        request.input = argv[1 + 2 * i];
        request.output = lines[i].name = argv[2 + 2 * i];
        jobs[i] = std::make_unique<movieconv::Job>(request, lines[i], [&](auto work) { loop.Post(work); });
        jobs[i]->Start();
    }
    while (!lines[0].ended || !lines[1].ended)
        loop.RunNext();
    return lines[0].well && lines[1].well ? 0 : 1;
}
