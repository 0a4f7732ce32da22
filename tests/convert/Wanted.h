// What tests ask for.
#ifndef MOVIECONV_TESTS_CONVERT_WANTED_H
#define MOVIECONV_TESTS_CONVERT_WANTED_H

#include "host/convert/Request.h"

#include <string>

/// Whatever "source" holds, in the file `output`.
inline movieconv::Request To(const std::string& output) {
    movieconv::Request request;
    request.input = "source";
    request.output = output;
    return request;
}

#endif
