// How many processors the program keeps busy.
#ifndef MOVIECONV_HOST_PROCESSORUSE_H
#define MOVIECONV_HOST_PROCESSORUSE_H

#include <chrono>
#include <ctime>

namespace host {

/// Counts from its construction.
class ProcessorUse {
public:
    /// Processors in use on average, by all threads of the program together.
    double Processors() const {
        const std::chrono::duration<double> wall = std::chrono::steady_clock::now() - began_;
        return static_cast<double>(std::clock() - worked_) / CLOCKS_PER_SEC / wall.count();
    }

private:
    std::chrono::steady_clock::time_point began_ = std::chrono::steady_clock::now();
    std::clock_t worked_ = std::clock();
};

} // namespace host

#endif
