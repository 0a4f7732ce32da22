// Converts for the window by means of the conversion library.
#ifndef MOVIECONV_HOST_WINDOW_RUNNER_CONVERTRUNNER_H
#define MOVIECONV_HOST_WINDOW_RUNNER_CONVERTRUNNER_H

#include "host/window/model/Runner.h"
#include "host/window/model/Worker.h"
#include "host/window/runner/LogShare.h"

namespace movieconv::window {

class ConvertRunner : public Runner {
public:
    Abilities Can() override;
    std::vector<PresetFacts> Presets() override;
    std::vector<FormatFacts> Formats() override;
    PresetFacts LoadPreset(const std::string& path) override;
    QStringList SavePreset(const std::string& path, const Wishes& wishes) override;
    std::string PresetFolder() override;
    std::unique_ptr<Run> Start(const Order& order, std::shared_ptr<RunListener> listener) override;
    MovieFacts Look(const std::string& path) override;
    std::string FileInTheWay(const Order& order) override;
    Findings Check(const Order& order) override;
    QImage PictureAt(const std::string& path, double seconds, int width) override;

private:
    LogShare log_;
    Worker remover_; // frees what a conversion leaves, which may take longer than the window can wait
};

} // namespace movieconv::window

#endif
