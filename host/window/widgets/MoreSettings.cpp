#include "host/window/widgets/MoreSettings.h"

#include "host/window/widgets/FormParts.h"

#include <QCheckBox>
#include <QHBoxLayout>
#include <QLineEdit>
#include <QLocale>
#include <QSpinBox>
#include <QToolButton>

namespace movieconv::window {
namespace {

constexpr std::array kRates = {60.0, 50.0, 30.0, 25.0, 24.0, 15.0};
constexpr std::array kClipMinutes = {1, 5, 10, 15, 30, 60};
constexpr std::array kCharsets = {"UTF-8",        "WINDOWS-1250", "WINDOWS-1251", "WINDOWS-1252",
                                  "WINDOWS-1253", "WINDOWS-1254", "WINDOWS-1255", "WINDOWS-1256",
                                  "ISO-8859-1",   "ISO-8859-2",   "ISO-8859-15",  "KOI8-R",
                                  "GB18030",      "BIG5",         "SHIFT_JIS",    "EUC-KR"};

enum CropWay { kNothing, kBorders, kByHand };

} // namespace

MoreSettings::MoreSettings(const Abilities& abilities, QWidget* parent)
    : QWidget(parent), more_(new QToolButton) {
    more_->setText(tr("M&ore"));
    more_->setCheckable(true);
    more_->setAutoRaise(true);
    more_->setArrowType(Qt::RightArrow);
    more_->setToolButtonStyle(Qt::ToolButtonTextBesideIcon);
    more_->setAccessibleDescription(tr("Shows or hides the settings that are seldom needed"));
    auto* rest = new QWidget;
    form_ = MakeForm(abilities);
    rest->setLayout(form_);
    rest->hide();
    connect(more_, &QToolButton::toggled, rest, [this, rest](bool open) {
        more_->setArrowType(open ? Qt::DownArrow : Qt::RightArrow);
        rest->setVisible(open);
    });
    auto* layout = new QVBoxLayout(this);
    layout->setContentsMargins(0, 0, 0, 0);
    layout->addWidget(more_);
    layout->addWidget(rest);
    FillChoices();
    Connect();
}

QFormLayout* MoreSettings::MakeForm(const Abilities& abilities) {
    rate_ = new QComboBox;
    channels_ = new QComboBox;
    clip_ = new QComboBox;
    deinterlace_ = new QComboBox;
    hdr_ = new QComboBox;
    depth_ = new QComboBox;
    charset_ = new QComboBox;
    title_ = new QLineEdit;
    title_->setClearButtonEnabled(true);
    for (QToolButton* clear : title_->findChildren<QToolButton*>())
        clear->setAccessibleName(tr("No title"));
    pictures_ = new QCheckBox(tr("Pictures"));
    sound_ = new QCheckBox(tr("Sound"));
    chapters_ = new QCheckBox(tr("&Keep the chapters"));
    texts_ = new QCheckBox(tr("Keep title, date and other texts"));
    auto* form = new QFormLayout;
    form->setContentsMargins(20, 0, 0, 0);
    form->setHorizontalSpacing(16);
    form->setVerticalSpacing(10);
    form->setLabelAlignment(Qt::AlignRight | Qt::AlignVCenter);
    AddRow(*form, tr("Pictures a seco&nd"), rate_);
    AddRow(*form, tr("Sound channels"), channels_);
    AddRow(*form, tr("Cut &into clips"), clip_, tr("Writes several files, each of that length."));
    AddRow(*form, tr("Deinterlacin&g"), deinterlace_, tr("Repairs the combs of old television pictures."));
    QWidget* crop = MakeCrop();
    form->addRow(MakeRowLabel(tr("Crop"), crop_), crop);
    AddRow(*form, tr("HDR pictures"), hdr_,
           tr("Pictures with more light and colour than usual displays have."));
    AddRow(*form, tr("Colour depth"), depth_);
    AddRow(*form, tr("Title"), title_, tr("What players show as the movie's name."));
    AddRow(*form, tr("Characters of the subtitle files"), charset_);
    auto* streams = new QHBoxLayout;
    streams->addWidget(pictures_);
    streams->addWidget(sound_);
    streams->addStretch();
    form->addRow(new QLabel(tr("Convert")), streams);
    form->addRow(QString(), chapters_);
    form->addRow(QString(), texts_);
    form->setRowVisible(deinterlace_, abilities.deinterlace);
    form->setRowVisible(crop, abilities.crop);
    return form;
}

QWidget* MoreSettings::MakeCrop() {
    crop_ = new QComboBox;
    crop_->setAccessibleName(tr("Crop"));
    margins_ = new QWidget;
    auto* margins = new QHBoxLayout(margins_);
    margins->setContentsMargins(0, 0, 0, 0);
    const std::array words = {tr("above"), tr("below"), tr("left"), tr("right")};
    for (size_t side = 0; side < sides_.size(); ++side) {
        auto* pixels = new QSpinBox;
        pixels->setSingleStep(2);
        pixels->setAccessibleName(tr("Pixels to cut off: %1").arg(words[side]));
        sides_[side] = pixels;
        margins->addWidget(new QLabel(words[side]));
        margins->addWidget(pixels);
    }
    margins->addStretch();
    auto* crop = new QWidget;
    auto* layout = new QVBoxLayout(crop);
    layout->setContentsMargins(0, 0, 0, 0);
    layout->setSpacing(6);
    layout->addWidget(crop_);
    layout->addWidget(margins_);
    return crop;
}

void MoreSettings::FillChoices() {
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
    crop_->addItem(tr("Nothing"), kNothing);
    crop_->addItem(tr("Black borders"), kBorders);
    crop_->addItem(tr("By hand"), kByHand);
    hdr_->addItem(tr("Kept where the format can"), static_cast<int>(Wishes::Hdr::kAuto));
    hdr_->addItem(tr("Kept"), static_cast<int>(Wishes::Hdr::kKeep));
    hdr_->addItem(tr("Made usual pictures"), static_cast<int>(Wishes::Hdr::kUsual));
    depth_->addItem(tr("As the source"));
    for (const int bits : {8, 10})
        depth_->addItem(tr("%1 bits").arg(bits), bits);
    charset_->addItem(tr("What they look like"), QString());
    for (const char* charset : kCharsets)
        charset_->addItem(QLatin1String(charset), QLatin1String(charset));
}

void MoreSettings::Connect() {
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
    connect(crop_, &QComboBox::activated, this, &MoreSettings::ChooseCrop);
    for (QSpinBox* side : sides_)
        connect(side, &QSpinBox::valueChanged, this, &MoreSettings::ChooseCrop);
    connect(hdr_, &QComboBox::activated, this, [this] {
        Choose(
            [this](Wishes& wishes) { wishes.hdr = static_cast<Wishes::Hdr>(hdr_->currentData().toInt()); });
    });
    connect(depth_, &QComboBox::activated, this,
            [this] { Choose([this](Wishes& wishes) { wishes.depth = ValueOf<int>(*depth_); }); });
    connect(charset_, &QComboBox::activated, this, [this] {
        Choose([this](Wishes& wishes) { wishes.subtitleCharset = charset_->currentData().toString(); });
    });
    connect(title_, &QLineEdit::textEdited, this,
            [this](const QString& text) { Choose([&](Wishes& wishes) { wishes.title = text; }); });
    connect(pictures_, &QCheckBox::toggled, this,
            [this](bool on) { Choose([on](Wishes& wishes) { wishes.withPictures = on; }); });
    connect(sound_, &QCheckBox::toggled, this,
            [this](bool on) { Choose([on](Wishes& wishes) { wishes.withSound = on; }); });
    connect(chapters_, &QCheckBox::toggled, this,
            [this](bool on) { Choose([on](Wishes& wishes) { wishes.chapters = on; }); });
    connect(texts_, &QCheckBox::toggled, this,
            [this](bool on) { Choose([on](Wishes& wishes) { wishes.texts = on; }); });
}

void MoreSettings::Show(const Wishes& wishes, const MovieFacts* facts) {
    filling_ = true;
    wishes_ = wishes;
    ChooseItem(*rate_, DataOf(wishes.rate));
    ChooseItem(*channels_, DataOf(wishes.channels));
    ChooseItem(*clip_, DataOf(wishes.clip));
    ChooseItem(*deinterlace_, static_cast<int>(wishes.deinterlace));
    ShowCrop(facts);
    ChooseItem(*hdr_, static_cast<int>(wishes.hdr));
    form_->setRowVisible(hdr_, facts != nullptr && facts->hdr);
    ChooseItem(*depth_, DataOf(wishes.depth));
    if (charset_->findData(wishes.subtitleCharset) < 0)
        charset_->addItem(wishes.subtitleCharset, wishes.subtitleCharset);
    ChooseItem(*charset_, wishes.subtitleCharset);
    form_->setRowVisible(charset_, !wishes.subtitleFiles.empty());
    const QString title = wishes.title.value_or(facts != nullptr && wishes.texts ? facts->title : QString());
    if (title != title_->text())
        title_->setText(title);
    pictures_->setChecked(wishes.withPictures);
    sound_->setChecked(wishes.withSound);
    chapters_->setChecked(wishes.chapters);
    chapters_->setEnabled(facts == nullptr || facts->chapters > 0);
    texts_->setChecked(wishes.texts);
    filling_ = false;
}

void MoreSettings::ShowCrop(const MovieFacts* facts) {
    const Margins cut = wishes_.cut.value_or(Margins{});
    const std::array values = {cut.top, cut.bottom, cut.left, cut.right};
    const std::array opposite = {cut.bottom, cut.top, cut.right, cut.left};
    constexpr int kLeast = 16; // pixels that have to be left
    for (size_t side = 0; side < sides_.size(); ++side) {
        const int whole = facts == nullptr ? 0 : side < 2 ? facts->height : facts->width;
        sides_[side]->setMaximum(std::max({0, values[side], whole - opposite[side] - kLeast}));
        sides_[side]->setValue(values[side]);
    }
    ChooseItem(*crop_, wishes_.cut ? kByHand : wishes_.crop ? kBorders : kNothing);
    margins_->setVisible(wishes_.cut.has_value());
}

void MoreSettings::ChooseCrop() {
    Choose([this](Wishes& wishes) {
        const int way = crop_->currentData().toInt();
        wishes.crop = way == kBorders;
        wishes.cut.reset();
        if (way == kByHand)
            wishes.cut =
                Margins{sides_[0]->value(), sides_[1]->value(), sides_[2]->value(), sides_[3]->value()};
    });
}

void MoreSettings::Choose(const std::function<void(Wishes&)>& change) {
    if (filling_)
        return;
    Wishes wishes = wishes_;
    change(wishes);
    if (wishes != wishes_)
        Q_EMIT Chosen(wishes);
}

} // namespace movieconv::window
