// Which options go with what is done instead of converting, and with what leaves a part of the movie out.
#ifndef MOVIECONV_HOST_TERMINAL_TASKCHECKS_H
#define MOVIECONV_HOST_TERMINAL_TASKCHECKS_H

namespace CLI {
class App;
}

namespace movieconv {

/// Throws Failure (kRequest) when the command line that `app` has parsed asks for two tasks, gives a task
/// options that it does not know or an option an empty value, or says how to make what it leaves out.
void CheckTask(const CLI::App& app);

} // namespace movieconv

#endif
