// What is to become of a movie that waits: everything that matters on one page, the rest behind "more".
#ifndef MOVIECONV_HOST_WINDOW_WIDGETS_ENTRYPAGE_H
#define MOVIECONV_HOST_WINDOW_WIDGETS_ENTRYPAGE_H

#include "host/window/model/Entry.h"
#include "host/window/model/Worker.h"

#include <QWidget>

class QCheckBox;
class QComboBox;
class QFormLayout;
class QLabel;
class QLineEdit;
class QPushButton;
class QSlider;
class QToolButton;

namespace movieconv::window {

class MoreSettings;
class RangeStrip;
class SubtitleFiles;
class TrackChoice;

class EntryPage : public QWidget {
    Q_OBJECT
public:
    /// `runner` must outlive it.
    explicit EntryPage(Runner& runner, QWidget* parent = nullptr);
    ~EntryPage() override;

    void Show(const Entry& entry);
    /// The presets there are now.
    void FillPresets();

Q_SIGNALS:
    void WishesChosen(quint64 id, const movieconv::window::Wishes& wishes);
    void TargetChosen(quint64 id, const std::string& path);
    void ReplaceChosen(quint64 id, bool replace);
    void AllWanted(const movieconv::window::Wishes& wishes);
    void SavingWanted(const movieconv::window::Wishes& wishes);
    void LoadingWanted(quint64 id);

private:
    QLayout* MakeHead();
    QFormLayout* MakeForm();
    QWidget* MakeRange();
    QWidget* MakeTarget();
    QLayout* MakeFoot();
    void AddTracks(QFormLayout* form);
    void Connect();
    void FillChoices();
    void ShowWishes();
    void ShowFindings();
    void ShowTracks();
    void AskForPictures();
    void Choose(const std::function<void(Wishes&)>& change);
    void ChooseTimes();
    void BrowseTarget();
    const PresetFacts* CurrentPreset() const;

    Runner& runner_;
    const Abilities abilities_;
    std::vector<PresetFacts> presets_;
    Entry entry_;
    bool filling_ = false;

    QLabel* title_;
    QLabel* facts_;
    QLabel* unusable_;
    QWidget* body_;
    QComboBox* preset_;
    QLabel* description_;
    QComboBox* format_;
    QComboBox* size_;
    QSlider* quality_;
    QLabel* qualityWords_;
    RangeStrip* strip_;
    QLineEdit* begin_;
    QLineEdit* end_;
    QLabel* soundsLabel_;
    TrackChoice* sounds_;
    QLabel* subtitlesLabel_;
    TrackChoice* subtitles_;
    SubtitleFiles* subtitleFiles_;
    QLineEdit* target_;
    QPushButton* browse_;
    QLabel* findings_;
    QLabel* notes_;
    QCheckBox* replace_;
    MoreSettings* more_;
    Worker worker_; // last: its tasks refer to the rest
};

} // namespace movieconv::window

#endif
