// Bundle functions that give out what a test sets.
#ifndef MOVIECONV_TESTS_LOG_SCRIPTEDBUNDLE_H
#define MOVIECONV_TESTS_LOG_SCRIPTEDBUNDLE_H

#include <string>

enum class Missing { Nothing, Bundle, Url, String };

struct ScriptedBundle {
    std::string url;
    Missing missing = Missing::Nothing;
    int urlsOut = 0; ///< URLs that were given out and not released.
};

extern ScriptedBundle g_bundle;

#endif
