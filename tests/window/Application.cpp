// An application around the tests, without a display.
#include <gtest/gtest.h>

#ifdef QT_WIDGETS_LIB
#include "host/window/App.h"

#include <QApplication>
using Application = QApplication;
#else
#include <QCoreApplication>
using Application = QCoreApplication;
#endif

#include <memory>

namespace {

class AroundTheTests : public testing::Environment {
public:
    void SetUp() override {
        setenv("QT_QPA_PLATFORM", "offscreen", 0);
        setenv("LC_ALL", "C.UTF-8", 1);
        application_ = std::make_unique<Application>(count_, arguments_);
#ifdef QT_WIDGETS_LIB
        movieconv::window::App::BringStyle();
#endif
    }
    void TearDown() override {
        application_.reset();
    }

private:
    int count_ = 1;
    char name_[5] = "test";
    char* arguments_[2] = {name_, nullptr};
    std::unique_ptr<Application> application_;
};

[[maybe_unused]] const auto* const kEnvironment = testing::AddGlobalTestEnvironment(new AroundTheTests);

} // namespace
