#include "host/window/widgets/EntryPage.h"

#include "host/window/model/Words.h"
#include "host/window/widgets/Icons.h"
#include "host/window/widgets/Look.h"
#include "host/window/widgets/RangeStrip.h"

#include <QApplication>
#include <QCheckBox>
#include <QComboBox>
#include <QFileDialog>
#include <QFormLayout>
#include <QGroupBox>
#include <QLabel>
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
constexpr std::array kRates = {60.0, 50.0, 30.0, 25.0, 24.0, 15.0};
constexpr std::array kClipMinutes = {1, 5, 10, 15, 30, 60};

/// Chooses the item with this data; the first one when there is none.
void Choose(QComboBox& box, const QVariant& data) {
    box.setCurrentIndex(std::max(0, box.findData(data)));
}

template <class T>
QVariant DataOf(const std::optional<T>& value) {
    return value ? QVariant(*value) : QVariant();
}

template <class T>
std::optional<T> ValueOf(const QComboBox& box) {
    const QVariant data = box.currentData();
    return data.isValid() ? std::optional(data.value<T>()) : std::nullopt;
}

void AddRow(QFormLayout& form, const QString& words, QWidget* field, const QString& description = {}) {
    auto* label = new QLabel(words);
    label->setBuddy(field);
    label->setMinimumHeight(field->sizeHint().height()); // in the middle beside it
    field->setAccessibleName(QString(words).remove(QLatin1Char('&')));
    if (!description.isEmpty()) {
        field->setToolTip(description);
        field->setAccessibleDescription(description);
    }
    form.addRow(label, field);
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
    body->addWidget(MakeMore());
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
    title_->setWordWrap(true);
    facts_ = MakeHint();
    unusable_ = new QLabel;
    unusable_->setWordWrap(true);
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
    AddRow(*form, tr("P&reset"), preset_);
    form->addRow(QString(), description_);
    AddRow(*form, tr("&File format"), format_);
    AddRow(*form, tr("Picture &size"), size_);
    auto* quality = new QHBoxLayout;
    quality->setSpacing(14);
    quality->addWidget(quality_, 1);
    quality->addWidget(qualityWords_);
    auto* label = new QLabel(tr("&Quality"));
    label->setBuddy(quality_);
    quality_->setAccessibleName(tr("Quality"));
    quality_->setToolTip(tr("To the left small files, to the right good pictures."));
    quality_->setAccessibleDescription(quality_->toolTip());
    form->addRow(label, quality);
    form->addRow(new QLabel(tr("Range")), MakeRange());
    AddTracks(form);
    form->addRow(new QLabel(tr("Save as")), MakeTarget());
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
    auto* to = new QLabel(tr("t&o"));
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
    sounds_ = new QGroupBox;
    subtitles_ = new QGroupBox;
    for (QGroupBox* box : {sounds_, subtitles_}) {
        box->setFlat(true);
        auto* layout = new QVBoxLayout(box);
        layout->setContentsMargins(0, 0, 0, 0);
        layout->setSpacing(4);
    }
    sounds_->setAccessibleName(tr("Sound tracks"));
    subtitles_->setAccessibleName(tr("Subtitles"));
    form->addRow(new QLabel(tr("Sound tracks")), sounds_);
    form->addRow(new QLabel(tr("Subtitles")), subtitles_);
}

QWidget* EntryPage::MakeTarget() {
    target_ = new QLineEdit;
    target_->setAccessibleName(tr("File to save as"));
    target_->setPlaceholderText(tr("By the naming rules"));
    target_->setClearButtonEnabled(true);
    for (QToolButton* clear : target_->findChildren<QToolButton*>())
        clear->setAccessibleName(tr("Back to the naming rules"));
    browse_ = new QPushButton(IconOf(Sign::kFolder), tr("C&hoose…"));
    browse_->setAccessibleName(tr("Choose the file to save as"));
    findings_ = new QLabel;
    findings_->setWordWrap(true);
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

QWidget* EntryPage::MakeMore() {
    more_ = new QToolButton;
    more_->setText(tr("&More"));
    more_->setCheckable(true);
    more_->setAutoRaise(true);
    more_->setArrowType(Qt::RightArrow);
    more_->setToolButtonStyle(Qt::ToolButtonTextBesideIcon);
    more_->setAccessibleDescription(tr("Shows or hides the settings that are seldom needed"));
    rate_ = new QComboBox;
    channels_ = new QComboBox;
    deinterlace_ = new QComboBox;
    crop_ = new QCheckBox(tr("Cut &black borders off"));
    clip_ = new QComboBox;
    pictures_ = new QCheckBox(tr("P&ictures"));
    sound_ = new QCheckBox(tr("Soun&d"));
    auto* rest = new QWidget;
    auto* form = new QFormLayout(rest);
    form->setContentsMargins(20, 0, 0, 0);
    form->setHorizontalSpacing(16);
    AddRow(*form, tr("Pictures a seco&nd"), rate_);
    AddRow(*form, tr("Sound c&hannels"), channels_);
    AddRow(*form, tr("Cut into c&lips"), clip_, tr("Writes several files, each of that length."));
    AddRow(*form, tr("Deinterlac&e"), deinterlace_, tr("Repairs the combs of old television pictures."));
    auto* streams = new QHBoxLayout;
    streams->addWidget(pictures_);
    streams->addWidget(sound_);
    streams->addStretch();
    form->addRow(new QLabel(tr("Convert")), streams);
    form->addRow(QString(), crop_);
    form->setRowVisible(deinterlace_, abilities_.deinterlace);
    form->setRowVisible(crop_, abilities_.crop);
    rest->hide();
    connect(more_, &QToolButton::toggled, rest, [this, rest](bool open) {
        more_->setArrowType(open ? Qt::DownArrow : Qt::RightArrow);
        rest->setVisible(open);
    });
    auto* more = new QWidget;
    auto* layout = new QVBoxLayout(more);
    layout->setContentsMargins(0, 0, 0, 0);
    layout->addWidget(more_);
    layout->addWidget(rest);
    return more;
}

QLayout* EntryPage::MakeFoot() {
    auto* all = new QPushButton(tr("&Use for all that wait"));
    all->setToolTip(tr("Gives every waiting movie these settings; ranges and tracks stay as they are."));
    all->setAccessibleDescription(all->toolTip());
    auto* save = new QPushButton(tr("Sa&ve as preset…"));
    auto* load = new QPushButton(tr("Load prese&t…"));
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
    rate_->addItem(tr("As the source"));
    for (const double rate : kRates)
        rate_->addItem(QLocale().toString(rate, 'g', 4), rate);
    channels_->addItem(tr("As the preset has it"));
    channels_->addItem(tr("Mono"), 1);
    channels_->addItem(tr("Stereo"), 2);
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
    connect(size_, &QComboBox::activated, this,
            [this] { Choose([this](Wishes& wishes) { wishes.height = ValueOf<int>(*size_); }); });
    connect(rate_, &QComboBox::activated, this,
            [this] { Choose([this](Wishes& wishes) { wishes.rate = ValueOf<double>(*rate_); }); });
    connect(channels_, &QComboBox::activated, this,
            [this] { Choose([this](Wishes& wishes) { wishes.channels = ValueOf<int>(*channels_); }); });
    connect(clip_, &QComboBox::activated, this,
            [this] { Choose([this](Wishes& wishes) { wishes.clip = ValueOf<double>(*clip_); }); });
    connect(deinterlace_, &QComboBox::activated, this, [this] {
        Choose([this](Wishes& wishes) {
            wishes.deinterlace = static_cast<Wishes::Deinterlace>(deinterlace_->currentData().toInt());
        });
    });
    connect(quality_, &QSlider::valueChanged, this,
            [this](int value) { Choose([value](Wishes& wishes) { wishes.quality = value; }); });
    connect(crop_, &QCheckBox::toggled, this,
            [this](bool on) { Choose([on](Wishes& wishes) { wishes.crop = on; }); });
    connect(pictures_, &QCheckBox::toggled, this,
            [this](bool on) { Choose([on](Wishes& wishes) { wishes.withPictures = on; }); });
    connect(sound_, &QCheckBox::toggled, this,
            [this](bool on) { Choose([on](Wishes& wishes) { wishes.withSound = on; }); });
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
    title_->setText(NameOf(entry.source).simplified());
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
    ShowMore();
    ShowFindings();
    filling_ = false;
}

void EntryPage::ShowWishes() {
    const Wishes& wishes = entry_.wishes;
    window::Choose(*preset_, wishes.preset);
    const PresetFacts* preset = CurrentPreset();
    description_->setText(preset != nullptr ? preset->description : QString());
    format_->setItemText(0, preset != nullptr ? tr("The preset's (.%1)").arg(preset->extension)
                                              : tr("The preset's"));
    window::Choose(*format_, DataOf(wishes.format));
    size_->setItemText(0,
                       entry_.facts && entry_.facts->width > 0
                           ? tr("As the source (%1 × %2)").arg(entry_.facts->width).arg(entry_.facts->height)
                           : tr("As the source"));
    window::Choose(*size_, DataOf(wishes.height));
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
    ShowTracks(sounds_, entry_.facts && abilities_.tracks ? entry_.facts->sounds : std::vector<TrackFacts>(),
               wishes.sounds);
    ShowTracks(subtitles_,
               entry_.facts && abilities_.tracks ? entry_.facts->subtitles : std::vector<TrackFacts>(),
               wishes.subtitles);
}

void EntryPage::ShowMore() {
    const Wishes& wishes = entry_.wishes;
    window::Choose(*rate_, DataOf(wishes.rate));
    window::Choose(*channels_, DataOf(wishes.channels));
    window::Choose(*clip_, DataOf(wishes.clip));
    window::Choose(*deinterlace_, static_cast<int>(wishes.deinterlace));
    crop_->setChecked(wishes.crop);
    pictures_->setChecked(wishes.withPictures);
    sound_->setChecked(wishes.withSound);
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

void EntryPage::ShowTracks(QGroupBox* box, const std::vector<TrackFacts>& tracks,
                           const std::optional<QList<int>>& chosen) {
    const QList<QCheckBox*> old = box->findChildren<QCheckBox*>();
    bool same = static_cast<size_t>(old.size()) == tracks.size();
    for (qsizetype i = 0; same && i < old.size(); ++i)
        same = old[i]->text() == TrackLine(tracks[static_cast<size_t>(i)]);
    if (!same) {
        qDeleteAll(old);
        for (const TrackFacts& track : tracks) {
            auto* check = new QCheckBox(TrackLine(track));
            check->setProperty("number", track.number);
            connect(check, &QCheckBox::toggled, this, [this] {
                Choose([this](Wishes& wishes) {
                    wishes.sounds = ChosenTracks(sounds_);
                    wishes.subtitles = ChosenTracks(subtitles_);
                });
            });
            box->layout()->addWidget(check);
        }
    }
    for (QCheckBox* check : box->findChildren<QCheckBox*>())
        check->setChecked(!chosen || chosen->contains(check->property("number").toInt()));
    // The row goes with its label.
    if (auto* form = qobject_cast<QFormLayout*>(body_->layout()->itemAt(0)->layout()))
        form->setRowVisible(box, !tracks.empty());
}

/// Nothing when all are.
std::optional<QList<int>> EntryPage::ChosenTracks(const QGroupBox* box) const {
    QList<int> numbers;
    const QList<QCheckBox*> checks = box->findChildren<QCheckBox*>();
    for (const QCheckBox* check : checks)
        if (check->isChecked())
            numbers.append(check->property("number").toInt());
    return numbers.size() == checks.size() ? std::nullopt : std::optional(numbers);
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
