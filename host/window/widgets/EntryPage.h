// What is to become of a movie that waits: everything that matters on one page, the rest behind "more".
#ifndef MOVIECONV_HOST_WINDOW_WIDGETS_ENTRYPAGE_H
#define MOVIECONV_HOST_WINDOW_WIDGETS_ENTRYPAGE_H

#include "host/window/model/Entry.h"

#include <QWidget>

class QCheckBox;
class QComboBox;
class QFormLayout;
class QLabel;
class QPushButton;
class QSlider;

namespace movieconv::window {

class BurnChoice;
class CropChoice;
class MoreSettings;
class RangeChoice;
class SubtitleFiles;
class TargetChoice;
class TrackChoice;

class EntryPage : public QWidget {
    Q_OBJECT
public:
    /// `runner` must outlive it.
    explicit EntryPage(Runner& runner, QWidget* parent = nullptr);

    void Show(const Entry& entry);
    /// Takes what is typed and not yet told: keys and menus leave a field without its knowing.
    void Commit();
    /// The presets there are now.
    void FillPresets();

Q_SIGNALS:
    void WishesChosen(quint64 id, const movieconv::window::Wishes& wishes);
    void TargetChosen(quint64 id, const std::string& path);
    void ReplaceChosen(quint64 id, bool replace);
    void AllWanted(const movieconv::window::Wishes& wishes);
    void SavingWanted(const movieconv::window::Wishes& wishes);
    void LoadingWanted(quint64 id);
    void LookWanted(quint64 id);

private:
    QLayout* MakeHead();
    QFormLayout* MakeForm();
    QLayout* MakePreset();
    QLayout* MakeQuality();
    QLayout* MakeFoot();
    void AddTracks(QFormLayout& form);
    void Connect();
    void ConnectPictures();
    void ConnectTracks();
    void FillChoices();
    void ShowWishes();
    void ShowTracks();
    void Choose(const std::function<void(Wishes&)>& change);
    const PresetFacts* CurrentPreset() const;
    bool CopiesSound(const Wishes& wishes) const;

    Runner& runner_;
    const Abilities abilities_;
    std::vector<PresetFacts> presets_;
    Entry entry_;
    bool filling_ = false;

    QLabel* title_;
    QLabel* facts_;
    QLabel* unusable_;
    QPushButton* look_;
    QWidget* page_; // which is scrolled
    QWidget* body_;
    QComboBox* preset_;
    QLabel* description_;
    QComboBox* format_;
    QComboBox* size_;
    QSlider* quality_;
    QLabel* qualityWords_;
    CropChoice* crop_;
    QComboBox* deinterlace_;
    RangeChoice* range_;
    QComboBox* clip_;
    QLabel* soundsLabel_;
    TrackChoice* sounds_;
    QCheckBox* copySound_;
    QLabel* subtitlesLabel_;
    TrackChoice* subtitles_;
    SubtitleFiles* subtitleFiles_;
    BurnChoice* burning_;
    TargetChoice* target_;
    MoreSettings* more_;
};

} // namespace movieconv::window

#endif
