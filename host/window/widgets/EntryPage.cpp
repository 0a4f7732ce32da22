#include "host/window/widgets/EntryPage.h"

#include "host/window/model/Words.h"
#include "host/window/widgets/FormParts.h"
#include "host/window/widgets/Icons.h"
#include "host/window/widgets/Look.h"
#include "host/window/widgets/MoreSettings.h"
#include "host/window/widgets/RangeStrip.h"
#include "host/window/widgets/SubtitleFiles.h"
#include "host/window/widgets/TrackChoice.h"

#include <QApplication>
#include <QCheckBox>
#include <QFileDialog>
#include <QLineEdit>
#include <QPushButton>
#include <QScrollArea>
#include <QSlider>
#include <QToolButton>

#include <algorithm>
#include <array>
#include <stdexcept>

namespace movieconv::window {
namespace {

constexpr int kStripWidth = 160; // of one of its pictures, in pixels
constexpr std::array kHeights = {2160, 1440, 1080, 720, 576, 480, 360};

/// Of a row whose first line is a box to tick.
int HeightOfTick() {
    return QCheckBox().sizeHint().height() + 2 * TrackChoice::kMargin;
}

} // namespace

EntryPage::EntryPage(Runner& runner, QWidget* parent)
    : QWidget(parent), runner_(runner), abilities_(runner.Can()), body_(new QWidget) {
    auto* scroll = new QScrollArea;
    scroll->setWidgetResizable(true);
    scroll->setFrameShape(QFrame::NoFrame);
    scroll->setHorizontalScrollBarPolicy(Qt::ScrollBarAlwaysOff);
    auto* page = new QWidget;
    auto* layout = new QVBoxLayout(page);
    layout->setContentsMargins(24, 20, 24, 16);
    layout->setSpacing(14);
    layout->addLayout(MakeHead());
    layout->addWidget(body_);
    layout->addStretch(1);
    auto* body = new QVBoxLayout(body_);
    body->setContentsMargins(0, 0, 0, 0);
    body->setSpacing(14);
    body->addLayout(MakeForm());
    more_ = new MoreSettings(abilities_);
    body->addWidget(more_);
    body->addLayout(MakeFoot());
    scroll->setWidget(page);
    auto* outer = new QVBoxLayout(this);
    outer->setContentsMargins(0, 0, 0, 0);
    outer->addWidget(scroll);
    FillPresets();
    FillChoices();
    Connect();
}

EntryPage::~EntryPage() = default;

QLayout* EntryPage::MakeHead() {
    title_ = MakeTitle({}, 1.5, true);
    facts_ = MakeHint();
    unusable_ = new QLabel;
    unusable_->setWordWrap(true);
    unusable_->setMinimumWidth(1); // a long path is cut and does not widen the page
    unusable_->setTextFormat(Qt::PlainText);
    unusable_->setAccessibleName(tr("Why it cannot be converted"));
    auto* head = new QVBoxLayout;
    head->setSpacing(4);
    head->addWidget(title_);
    head->addWidget(facts_);
    head->addWidget(unusable_);
    return head;
}

QFormLayout* EntryPage::MakeForm() {
    preset_ = new QComboBox;
    description_ = MakeHint();
    description_->setWordWrap(false); // the form keeps a second line's room once it had one
    description_->setMinimumWidth(1);
    format_ = new QComboBox;
    size_ = new QComboBox;
    quality_ = new QSlider(Qt::Horizontal);
    quality_->setRange(0, 100);
    quality_->setPageStep(10);
    qualityWords_ = MakeHint();
    qualityWords_->setWordWrap(false);
    qualityWords_->setMinimumWidth(fontMetrics().horizontalAdvance(tr("As the preset has it")) + 8);
    auto* form = new QFormLayout;
    form->setHorizontalSpacing(16);
    form->setVerticalSpacing(10);
    form->setFieldGrowthPolicy(QFormLayout::AllNonFixedFieldsGrow);
    form->setLabelAlignment(Qt::AlignRight | Qt::AlignVCenter);
    auto* preset = new QVBoxLayout;
    preset->setSpacing(4);
    preset->addWidget(preset_);
    preset->addWidget(description_);
    preset_->setAccessibleName(tr("Preset"));
    form->addRow(MakeRowLabel(tr("&Preset"), preset_), preset);
    AddRow(*form, tr("&File format"), format_);
    AddRow(*form, tr("Picture &size"), size_);
    auto* quality = new QHBoxLayout;
    quality->setSpacing(14);
    quality->addWidget(quality_, 1);
    quality->addWidget(qualityWords_);
    auto* label = new QLabel(tr("Qualit&y"));
    label->setBuddy(quality_);
    quality_->setAccessibleName(tr("Quality"));
    quality_->setToolTip(tr("To the left small files, to the right good pictures."));
    quality_->setAccessibleDescription(quality_->toolTip());
    form->addRow(label, quality);
    form->addRow(new QLabel(tr("Range")), MakeRange());
    AddTracks(form);
    QWidget* target = MakeTarget();
    form->addRow(MakeRowLabel(tr("Save as"), browse_), target);
    return form;
}

QWidget* EntryPage::MakeRange() {
    strip_ = new RangeStrip;
    begin_ = new QLineEdit;
    end_ = new QLineEdit;
    begin_->setAccessibleName(tr("Begin of the range"));
    end_->setAccessibleName(tr("End of the range"));
    for (QLineEdit* edit : {begin_, end_}) {
        edit->setMaximumWidth(fontMetrics().horizontalAdvance(QStringLiteral("00:00:00.000")) + 24);
        edit->setToolTip(tr("Hours, minutes and seconds, such as 1:02:03"));
        edit->setAccessibleDescription(edit->toolTip());
    }
    auto* times = new QHBoxLayout;
    auto* from = new QLabel(tr("f&rom"));
    from->setBuddy(begin_);
    auto* to = new QLabel(tr("&to"));
    to->setBuddy(end_);
    times->addWidget(from);
    times->addWidget(begin_);
    times->addWidget(to);
    times->addWidget(end_);
    times->addStretch();
    auto* range = new QWidget;
    auto* layout = new QVBoxLayout(range);
    layout->setContentsMargins(0, 0, 0, 0);
    layout->setSpacing(6);
    layout->addWidget(strip_);
    layout->addLayout(times);
    return range;
}

void EntryPage::AddTracks(QFormLayout* form) {
    sounds_ = new TrackChoice(tr("Sound tracks"));
    subtitles_ = new TrackChoice(tr("Subtitles"));
    subtitleFiles_ = new SubtitleFiles;
    auto* texts = new QWidget;
    auto* layout = new QVBoxLayout(texts);
    layout->setContentsMargins(0, 0, 0, 0);
    layout->setSpacing(6);
    layout->addWidget(subtitles_);
    layout->addWidget(subtitleFiles_);
    soundsLabel_ = new QLabel(tr("Sound tracks"));
    soundsLabel_->setFixedHeight(HeightOfTick());
    subtitlesLabel_ = new QLabel(tr("Subtitles"));
    form->addRow(soundsLabel_, sounds_);
    form->addRow(subtitlesLabel_, texts);
}

QWidget* EntryPage::MakeTarget() {
    target_ = new QLineEdit;
    target_->setAccessibleName(tr("File to save as"));
    target_->setPlaceholderText(tr("By the naming rules"));
    target_->setClearButtonEnabled(true);
    for (QToolButton* clear : target_->findChildren<QToolButton*>())
        clear->setAccessibleName(tr("Back to the naming rules"));
    browse_ = new QPushButton(IconOf(Sign::kFolder), tr("Choos&e…"));
    browse_->setAccessibleName(tr("Choose the file to save as"));
    findings_ = new QLabel;
    findings_->setWordWrap(true);
    findings_->setMinimumWidth(1);
    findings_->setTextFormat(Qt::PlainText);
    findings_->setAccessibleName(tr("Warnings"));
    notes_ = MakeHint();
    notes_->setAccessibleName(tr("Notes"));
    replace_ = new QCheckBox(tr("Replace the file that e&xists"));
    auto* row = new QHBoxLayout;
    row->addWidget(target_, 1);
    row->addWidget(browse_);
    auto* target = new QWidget;
    auto* layout = new QVBoxLayout(target);
    layout->setContentsMargins(0, 0, 0, 0);
    layout->setSpacing(6);
    layout->addLayout(row);
    layout->addWidget(findings_);
    layout->addWidget(notes_);
    layout->addWidget(replace_);
    return target;
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
    connect(size_, &QComboBox::activated, this,
            [this] { Choose([this](Wishes& wishes) { wishes.height = ValueOf<int>(*size_); }); });
    connect(quality_, &QSlider::valueChanged, this,
            [this](int value) { Choose([value](Wishes& wishes) { wishes.quality = value; }); });
    connect(sounds_, &TrackChoice::Chosen, this, [this](const std::optional<QList<int>>& numbers) {
        Choose([&](Wishes& wishes) { wishes.sounds = numbers; });
    });
    connect(subtitles_, &TrackChoice::Chosen, this, [this](const std::optional<QList<int>>& numbers) {
        Choose([&](Wishes& wishes) { wishes.subtitles = numbers; });
    });
    connect(subtitleFiles_, &SubtitleFiles::Chosen, this, [this](const std::vector<SubtitleFile>& files) {
        Choose([&](Wishes& wishes) { wishes.subtitleFiles = files; });
    });
    connect(more_, &MoreSettings::Chosen, this,
            [this](const Wishes& chosen) { Choose([&](Wishes& wishes) { wishes = chosen; }); });
    connect(strip_, &RangeStrip::RangeChosen, this, [this](double begin, std::optional<double> end) {
        Choose([&](Wishes& wishes) {
            wishes.begin = begin;
            wishes.end = end;
        });
    });
    connect(begin_, &QLineEdit::editingFinished, this, &EntryPage::ChooseTimes);
    connect(end_, &QLineEdit::editingFinished, this, &EntryPage::ChooseTimes);
    connect(target_, &QLineEdit::editingFinished, this, [this] {
        if (target_->isModified())
            Q_EMIT TargetChosen(entry_.id, target_->text().toStdString());
    });
    connect(browse_, &QPushButton::clicked, this, &EntryPage::BrowseTarget);
    connect(replace_, &QCheckBox::toggled, this, [this](bool on) {
        if (!filling_)
            Q_EMIT ReplaceChosen(entry_.id, on);
    });
}

void EntryPage::Show(const Entry& entry) {
    const bool other = entry.id != entry_.id;
    const bool found = entry.facts.has_value() && (other || !entry_.facts);
    entry_ = entry;
    filling_ = true;
    SetTitle(*title_, NameOf(entry.source).simplified());
    facts_->setText(entry.facts ? FactsLine(*entry.facts) : tr("Looking at it…"));
    facts_->setVisible(entry.facts || entry.unusable.isEmpty());
    unusable_->setText(entry.unusable);
    unusable_->setVisible(!entry.unusable.isEmpty());
    body_->setVisible(entry.unusable.isEmpty());
    if (other || found) {
        strip_->SetLength(entry.facts ? entry.facts->seconds : 0);
        AskForPictures();
    }
    ShowWishes();
    ShowFindings();
    filling_ = false;
}

void EntryPage::ShowWishes() {
    const Wishes& wishes = entry_.wishes;
    ChooseItem(*preset_, wishes.preset);
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
    strip_->SetRange(wishes.begin, wishes.end);
    const double length = entry_.facts ? entry_.facts->seconds : 0;
    begin_->setText(ClockText(wishes.begin));
    end_->setText(wishes.end ? ClockText(*wishes.end) : length > 0 ? ClockText(length) : QString());
    ShowTracks();
    more_->Show(wishes, entry_.facts ? &*entry_.facts : nullptr);
}

void EntryPage::ShowTracks() {
    const bool known = entry_.facts && abilities_.tracks;
    const std::vector<TrackFacts> none;
    const std::vector<TrackFacts>& sounds = known ? entry_.facts->sounds : none;
    const std::vector<TrackFacts>& subtitles = known ? entry_.facts->subtitles : none;
    sounds_->Show(sounds, entry_.wishes.sounds);
    sounds_->setVisible(!sounds.empty());
    sounds_->setEnabled(entry_.wishes.withSound);
    soundsLabel_->setVisible(!sounds.empty());
    subtitles_->Show(subtitles, entry_.wishes.subtitles);
    subtitles_->setVisible(!subtitles.empty());
    subtitleFiles_->Show(entry_.wishes.subtitleFiles, entry_.source);
    subtitleFiles_->setVisible(known);
    subtitlesLabel_->setVisible(known);
    subtitlesLabel_->setFixedHeight(subtitles.empty() ? browse_->sizeHint().height() : HeightOfTick());
}

void EntryPage::ShowFindings() {
    if (!target_->hasFocus() || !target_->isModified())
        target_->setText(Readable(entry_.target));
    target_->setCursorPosition(static_cast<int>(target_->text().size()));
    findings_->setText(entry_.findings.warnings.join(QLatin1Char('\n')));
    findings_->setVisible(!entry_.findings.warnings.isEmpty());
    notes_->setText(entry_.findings.notes.join(QLatin1Char('\n')));
    notes_->setVisible(!entry_.findings.notes.isEmpty());
    QPalette colours = QApplication::palette();
    colours.setColor(QPalette::WindowText, WarningColour(colours));
    findings_->setPalette(colours);
    colours.setColor(QPalette::WindowText, BadColour(colours));
    unusable_->setPalette(colours);
    replace_->setChecked(entry_.replace);
    replace_->setVisible(entry_.findings.targetExists);
}

void EntryPage::AskForPictures() {
    worker_.Forget();
    if (!entry_.facts || entry_.facts->width == 0)
        return;
    for (int i = 0; i < RangeStrip::kPictures; ++i) {
        worker_.Do(0, [this, i, id = entry_.id, path = entry_.source, seconds = strip_->TimeOf(i)] {
            QImage picture;
            try {
                picture = runner_.PictureAt(path, seconds, kStripWidth);
            } catch (const std::runtime_error&) {
                return; // the strip stays empty there
            }
            QMetaObject::invokeMethod(this, [this, i, id, picture] {
                if (id == entry_.id)
                    strip_->SetPicture(i, picture);
            });
        });
    }
}

void EntryPage::Choose(const std::function<void(Wishes&)>& change) {
    if (filling_)
        return;
    Wishes wishes = entry_.wishes;
    change(wishes);
    if (wishes != entry_.wishes)
        Q_EMIT WishesChosen(entry_.id, wishes);
}

void EntryPage::ChooseTimes() {
    Choose([this](Wishes& wishes) {
        const double length = entry_.facts && entry_.facts->lengthKnown ? entry_.facts->seconds : 1e7;
        const std::optional<double> begin = ParseClock(begin_->text());
        const std::optional<double> end = ParseClock(end_->text());
        if (begin_->isModified() && begin && *begin < length)
            wishes.begin = *begin;
        if (end_->isModified())
            wishes.end = end && *end<length&& * end> wishes.begin ? end : std::nullopt;
        if (wishes.end && wishes.begin >= *wishes.end)
            wishes.end.reset();
    });
    filling_ = true; // what made no sense goes back to what holds
    ShowWishes();
    filling_ = false;
}

void EntryPage::BrowseTarget() {
    auto* dialog = new QFileDialog(this, tr("Save as"), QString(), QString());
    dialog->setAttribute(Qt::WA_DeleteOnClose);
    dialog->setAcceptMode(QFileDialog::AcceptSave);
    dialog->setOption(QFileDialog::DontConfirmOverwrite); // the page warns
    dialog->selectFile(Readable(entry_.target));
    connect(dialog, &QFileDialog::fileSelected, this,
            [this, id = entry_.id](const QString& path) { Q_EMIT TargetChosen(id, path.toStdString()); });
    dialog->show();
}

const PresetFacts* EntryPage::CurrentPreset() const {
    const auto found = std::find_if(presets_.begin(), presets_.end(), [this](const PresetFacts& preset) {
        return preset.name == entry_.wishes.preset;
    });
    return found == presets_.end() ? nullptr : &*found;
}

} // namespace movieconv::window
