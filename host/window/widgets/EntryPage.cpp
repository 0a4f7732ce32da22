#include "host/window/widgets/EntryPage.h"

#include "host/window/model/Words.h"
#include "host/window/widgets/BurnChoice.h"
#include "host/window/widgets/CropChoice.h"
#include "host/window/widgets/FormParts.h"
#include "host/window/widgets/Icons.h"
#include "host/window/widgets/Look.h"
#include "host/window/widgets/MoreSettings.h"
#include "host/window/widgets/RangeChoice.h"
#include "host/window/widgets/SubtitleFiles.h"
#include "host/window/widgets/TargetChoice.h"
#include "host/window/widgets/TrackChoice.h"

#include <QCheckBox>
#include <QPushButton>
#include <QScrollArea>
#include <QSlider>

#include <algorithm>
#include <array>

namespace movieconv::window {
namespace {

constexpr std::array kHeights = {2160, 1440, 1080, 720, 576, 480, 360};
constexpr std::array kClipMinutes = {1, 5, 10, 15, 30, 60};

/// Of a row whose first line is a box to tick.
int HeightOfTick() {
    return QCheckBox().sizeHint().height() + 2 * TrackChoice::kMargin;
}

} // namespace

EntryPage::EntryPage(Runner& runner, QWidget* parent)
    : QWidget(parent), runner_(runner), abilities_(runner.Can()), page_(new QWidget), body_(new QWidget) {
    auto* scroll = new QScrollArea;
    scroll->setWidgetResizable(true);
    scroll->setFrameShape(QFrame::NoFrame);
    scroll->setHorizontalScrollBarPolicy(Qt::ScrollBarAlwaysOff);
    scroll->setFocusPolicy(Qt::NoFocus); // it follows what has the focus
    auto* layout = new QVBoxLayout(page_);
    layout->setContentsMargins(24, 20, 24, 16);
    layout->setSpacing(14);
    layout->addLayout(MakeHead());
    layout->addWidget(body_);
    layout->addStretch(1);
    QVBoxLayout* body = MakeColumn(*body_, 14);
    body->addLayout(MakeForm());
    more_ = new MoreSettings;
    body->addWidget(more_);
    body->addLayout(MakeFoot());
    scroll->setWidget(page_);
    MakeColumn(*this, 0)->addWidget(scroll);
    LeaveWheelToPageBelow(*page_);
    FillPresets();
    FillChoices();
    Connect();
}

QLayout* EntryPage::MakeHead() {
    title_ = MakeTitle({}, 1.5, true);
    facts_ = MakeHint();
    unusable_ = MakeRemark(&BadColour);
    unusable_->setAccessibleName(tr("Why it cannot be converted"));
    look_ = new QPushButton(IconOf(Sign::kAgain), tr("Look &again"));
    look_->setAccessibleDescription(tr("Finds out whether the movie can be converted now"));
    connect(look_, &QPushButton::clicked, this, [this] { Q_EMIT LookWanted(entry_.id); });
    auto* head = new QVBoxLayout;
    head->setSpacing(4);
    head->addWidget(title_);
    head->addWidget(facts_);
    head->addWidget(unusable_);
    head->addSpacing(8);
    head->addWidget(look_, 0, Qt::AlignLeft);
    return head;
}

QFormLayout* EntryPage::MakeForm() {
    format_ = new QComboBox;
    size_ = new QComboBox;
    crop_ = new CropChoice;
    deinterlace_ = new QComboBox;
    range_ = new RangeChoice(runner_);
    clip_ = new QComboBox;
    target_ = new TargetChoice;
    auto* form = new QFormLayout;
    form->setHorizontalSpacing(16);
    form->setVerticalSpacing(10);
    form->setFieldGrowthPolicy(QFormLayout::AllNonFixedFieldsGrow);
    form->setLabelAlignment(Qt::AlignRight | Qt::AlignVCenter);
    QLayout* preset = MakePreset();
    form->addRow(MakeRowLabel(tr("&Preset"), preset_), preset);
    AddRow(*form, tr("&File format"), format_);
    AddRow(*form, tr("Picture &size"), size_);
    form->addRow(MakeRowLabel(tr("Crop"), crop_->Box()), crop_);
    AddRow(*form, tr("Deinterlacin&g"), deinterlace_, tr("Repairs the combs of old television pictures."));
    QLayout* quality = MakeQuality();
    auto* label = new QLabel(tr("Qualit&y"));
    label->setBuddy(quality_);
    form->addRow(label, quality);
    form->addRow(new QLabel(tr("Range")), range_);
    AddRow(*form, tr("Cut &into clips"), clip_, tr("Writes several files, each of that length."));
    AddTracks(*form);
    form->addRow(MakeRowLabel(tr("Save as"), target_->Button()), target_);
    form->setRowVisible(crop_, abilities_.crop);
    form->setRowVisible(deinterlace_, abilities_.deinterlace);
    return form;
}

QLayout* EntryPage::MakePreset() {
    preset_ = new QComboBox;
    AllowNarrow(*preset_);
    preset_->setAccessibleName(tr("Preset"));
    description_ = MakeHint();
    description_->setWordWrap(false); // the form keeps a second line's room once it had one
    description_->setMinimumWidth(1);
    auto* preset = new QVBoxLayout;
    preset->setSpacing(4);
    preset->addWidget(preset_);
    preset->addWidget(description_);
    return preset;
}

QLayout* EntryPage::MakeQuality() {
    quality_ = new QSlider(Qt::Horizontal);
    quality_->setRange(0, 100);
    quality_->setPageStep(10);
    quality_->setAccessibleName(tr("Quality"));
    quality_->setToolTip(tr("To the left small files, to the right good pictures."));
    quality_->setAccessibleDescription(quality_->toolTip());
    qualityWords_ = MakeHint();
    qualityWords_->setWordWrap(false);
    qualityWords_->setMinimumWidth(fontMetrics().horizontalAdvance(tr("As the preset has it")) + 8);
    auto* quality = new QHBoxLayout;
    quality->setSpacing(14);
    quality->addWidget(quality_, 1);
    quality->addWidget(qualityWords_);
    return quality;
}

void EntryPage::AddTracks(QFormLayout& form) {
    sounds_ = new TrackChoice(tr("Sound tracks"));
    copySound_ = new QCheckBox(tr("Leave the sound as it is"));
    copySound_->setToolTip(tr("Sound is not converted but taken over: without loss, with its own channels."));
    copySound_->setAccessibleDescription(copySound_->toolTip());
    subtitles_ = new TrackChoice(tr("Subtitles"));
    burning_ = new BurnChoice;
    subtitleFiles_ = new SubtitleFiles;
    auto* sound = new QWidget;
    QVBoxLayout* layout = MakeColumn(*sound, 6);
    layout->addWidget(sounds_);
    layout->addWidget(copySound_);
    auto* texts = new QWidget;
    layout = MakeColumn(*texts, 6);
    layout->addWidget(subtitles_);
    layout->addWidget(subtitleFiles_);
    layout->addWidget(burning_);
    soundsLabel_ = new QLabel(tr("Sound tracks"));
    soundsLabel_->setFixedHeight(HeightOfTick());
    subtitlesLabel_ = new QLabel(tr("Subtitles"));
    form.addRow(soundsLabel_, sound);
    form.addRow(subtitlesLabel_, texts);
}

QLayout* EntryPage::MakeFoot() {
    auto* all = new QPushButton(tr("&Use for all that wait"));
    all->setToolTip(tr("Gives every waiting movie these settings; ranges and tracks stay as they are."));
    all->setAccessibleDescription(all->toolTip());
    auto* save = new QPushButton(tr("Sa&ve as preset…"));
    auto* load = new QPushButton(tr("&Load preset…"));
    for (QPushButton* button : {save, load})
        button->setVisible(abilities_.presetFiles);
    connect(all, &QPushButton::clicked, this, [this] { Q_EMIT AllWanted(entry_.wishes); });
    connect(save, &QPushButton::clicked, this, [this] { Q_EMIT SavingWanted(entry_.wishes); });
    connect(load, &QPushButton::clicked, this, [this] { Q_EMIT LoadingWanted(entry_.id); });
    auto* foot = new QHBoxLayout;
    foot->addWidget(all);
    foot->addStretch();
    foot->addWidget(save);
    foot->addWidget(load);
    return foot;
}

void EntryPage::FillPresets() {
    filling_ = true;
    presets_ = runner_.Presets();
    preset_->clear();
    for (const PresetFacts& preset : presets_)
        preset_->addItem(preset.title, preset.name);
    filling_ = false;
}

void EntryPage::FillChoices() {
    format_->addItem(QString()); // the preset's, named when a preset is shown
    for (const FormatFacts& format : runner_.Formats())
        format_->addItem(QStringLiteral("%1 (.%2)").arg(format.name, format.extension), format.extension);
    size_->addItem(tr("As the source"));
    for (const int height : kHeights)
        size_->addItem(tr("%1 lines").arg(height), height);
    clip_->addItem(tr("No, one file"));
    for (const int minutes : kClipMinutes)
        clip_->addItem(tr("Of %n minutes", "", minutes), minutes * 60.0);
    deinterlace_->addItem(tr("Where the source says so"), static_cast<int>(Wishes::Deinterlace::kAuto));
    deinterlace_->addItem(tr("Never"), static_cast<int>(Wishes::Deinterlace::kOff));
    deinterlace_->addItem(tr("Everything"), static_cast<int>(Wishes::Deinterlace::kAll));
}

void EntryPage::Connect() {
    connect(preset_, &QComboBox::activated, this, [this] {
        Choose([this](Wishes& wishes) {
            wishes.preset = preset_->currentData().toString();
            wishes.format.reset();
            wishes.quality.reset();
        });
    });
    connect(format_, &QComboBox::activated, this,
            [this] { Choose([this](Wishes& wishes) { wishes.format = ValueOf<QString>(*format_); }); });
    connect(quality_, &QSlider::valueChanged, this,
            [this](int value) { Choose([value](Wishes& wishes) { wishes.quality = value; }); });
    connect(more_, &MoreSettings::Chosen, this,
            [this](const Wishes& chosen) { Choose([&](Wishes& wishes) { wishes = chosen; }); });
    connect(target_, &TargetChoice::PathChosen, this, &EntryPage::TargetChosen);
    connect(target_, &TargetChoice::ReplaceChosen, this, &EntryPage::ReplaceChosen);
    ConnectPictures();
    ConnectTracks();
}

void EntryPage::ConnectPictures() {
    connect(size_, &QComboBox::activated, this,
            [this] { Choose([this](Wishes& wishes) { wishes.height = ValueOf<int>(*size_); }); });
    connect(crop_, &CropChoice::Chosen, this, [this](bool borders, const std::optional<Margins>& cut) {
        Choose([&](Wishes& wishes) {
            wishes.crop = borders;
            wishes.cut = cut;
        });
    });
    connect(deinterlace_, &QComboBox::activated, this, [this] {
        Choose([this](Wishes& wishes) {
            wishes.deinterlace = static_cast<Wishes::Deinterlace>(deinterlace_->currentData().toInt());
        });
    });
    connect(range_, &RangeChoice::Chosen, this, [this](double begin, std::optional<double> end) {
        Choose([&](Wishes& wishes) {
            wishes.begin = begin;
            wishes.end = end;
        });
    });
    connect(clip_, &QComboBox::activated, this,
            [this] { Choose([this](Wishes& wishes) { wishes.clip = ValueOf<double>(*clip_); }); });
}

void EntryPage::ConnectTracks() {
    connect(sounds_, &TrackChoice::Chosen, this, [this](const std::optional<QList<int>>& numbers) {
        Choose([&](Wishes& wishes) { wishes.sounds = numbers; });
    });
    connect(copySound_, &QCheckBox::toggled, this, [this](bool on) {
        Choose([&](Wishes& wishes) {
            wishes.copySound = on == CopiesSound(Wishes()) ? std::nullopt : std::optional(on);
        });
    });
    connect(subtitles_, &TrackChoice::Chosen, this, [this](const std::optional<QList<int>>& numbers) {
        Choose([&](Wishes& wishes) { wishes.subtitles = numbers; });
    });
    connect(subtitleFiles_, &SubtitleFiles::Chosen, this, [this](const std::vector<SubtitleFile>& files) {
        Choose([&](Wishes& wishes) { wishes.subtitleFiles = files; });
    });
    connect(burning_, &BurnChoice::Chosen, this,
            [this](const Burning& burning) { Choose([&](Wishes& wishes) { Burn(wishes, burning); }); });
}

void EntryPage::Show(const Entry& entry) {
    entry_ = entry;
    filling_ = true;
    SetTitle(*title_, NameOf(entry.source));
    facts_->setText(entry.facts ? FactsLine(*entry.facts) : tr("Looking at it…"));
    facts_->setVisible(entry.facts || entry.unusable.isEmpty());
    unusable_->setText(entry.unusable);
    unusable_->setVisible(!entry.unusable.isEmpty());
    look_->setVisible(!entry.unusable.isEmpty());
    body_->setVisible(entry.unusable.isEmpty());
    ShowWishes();
    target_->Show(entry);
    OrderTabs(*page_);
    filling_ = false;
}

void EntryPage::Commit() {
    range_->Commit();
    target_->Commit();
}

void EntryPage::ShowWishes() {
    const Wishes& wishes = entry_.wishes;
    preset_->setCurrentIndex(preset_->findData(wishes.preset));
    preset_->setPlaceholderText(wishes.preset); // of one that is gone
    const PresetFacts* preset = CurrentPreset();
    description_->setText(preset != nullptr ? preset->description : QString());
    description_->setToolTip(description_->text()); // a narrow window cuts it
    format_->setItemText(0, preset != nullptr ? tr("The preset's (.%1)").arg(preset->extension)
                                              : tr("The preset's"));
    ChooseItem(*format_, DataOf(wishes.format));
    size_->setItemText(0,
                       entry_.facts && entry_.facts->width > 0
                           ? tr("As the source (%1 × %2)").arg(entry_.facts->width).arg(entry_.facts->height)
                           : tr("As the source"));
    ChooseItem(*size_, DataOf(wishes.height));
    const int usual = preset != nullptr ? preset->quality : -1;
    quality_->setEnabled(usual >= 0);
    quality_->setValue(wishes.quality.value_or(std::max(usual, 0)));
    qualityWords_->setText(!wishes.quality        ? tr("As the preset has it")
                           : *wishes.quality < 35 ? tr("Small file")
                           : *wishes.quality < 70 ? tr("Balanced")
                                                  : tr("Good pictures"));
    crop_->Show(wishes, entry_.facts ? &*entry_.facts : nullptr);
    ChooseItem(*deinterlace_, static_cast<int>(wishes.deinterlace));
    range_->Show(entry_);
    ChooseItem(*clip_, DataOf(wishes.clip));
    ShowTracks();
    more_->Show(wishes, entry_.facts ? &*entry_.facts : nullptr, CopiesSound(wishes));
}

void EntryPage::ShowTracks() {
    const bool known = entry_.facts && abilities_.tracks;
    const std::vector<TrackFacts> none;
    const std::vector<TrackFacts>& sounds = known ? entry_.facts->sounds : none;
    const std::vector<TrackFacts>& subtitles = known ? entry_.facts->subtitles : none;
    const Wishes& wishes = entry_.wishes;
    sounds_->Show(sounds, wishes.sounds);
    copySound_->setChecked(CopiesSound(wishes));
    for (QWidget* part : std::initializer_list<QWidget*>{sounds_, copySound_}) {
        part->setVisible(!sounds.empty());
        part->setEnabled(wishes.withSound);
    }
    soundsLabel_->setVisible(!sounds.empty());
    subtitles_->Show(subtitles, wishes.subtitles, wishes.burning.track);
    subtitles_->setVisible(!subtitles.empty());
    subtitleFiles_->Show(wishes.subtitleFiles, entry_.source);
    subtitleFiles_->setVisible(known);
    burning_->Show(subtitles, wishes.burning, entry_.source);
    burning_->setVisible(known && entry_.facts->width > 0);
    burning_->setEnabled(wishes.withPictures);
    subtitlesLabel_->setVisible(known);
    subtitlesLabel_->setFixedHeight(subtitles.empty() ? target_->Button()->sizeHint().height()
                                                      : HeightOfTick());
}

void EntryPage::Choose(const std::function<void(Wishes&)>& change) {
    if (filling_)
        return;
    Wishes wishes = entry_.wishes;
    change(wishes);
    if (wishes != entry_.wishes)
        Q_EMIT WishesChosen(entry_.id, wishes);
}

const PresetFacts* EntryPage::CurrentPreset() const {
    const auto found = std::find_if(presets_.begin(), presets_.end(), [this](const PresetFacts& preset) {
        return preset.name == entry_.wishes.preset;
    });
    return found == presets_.end() ? nullptr : &*found;
}

bool EntryPage::CopiesSound(const Wishes& wishes) const {
    const PresetFacts* preset = CurrentPreset();
    return wishes.copySound.value_or(preset != nullptr && preset->copiesSound);
}

} // namespace movieconv::window
