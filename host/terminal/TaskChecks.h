// Which options go with what is done instead of converting.
#ifndef MOVIECONV_HOST_TERMINAL_TASKCHECKS_H
#define MOVIECONV_HOST_TERMINAL_TASKCHECKS_H

namespace CLI {
class App;
}

namespace movieconv {

/// Throws Failure (kRequest) when the command line that `app` has parsed asks for two tasks, gives a task
/// options that it does not know, or an option an empty value.
void CheckTask(const CLI::App& app);

} // namespace movieconv

#endif
