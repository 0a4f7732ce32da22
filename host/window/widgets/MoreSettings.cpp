#include "host/window/widgets/MoreSettings.h"

#include "host/window/widgets/FormParts.h"

#include <QCheckBox>
#include <QHBoxLayout>
#include <QLineEdit>
#include <QLocale>
#include <QToolButton>

#include <array>

namespace movieconv::window {
namespace {

constexpr std::array kRates = {60.0, 50.0, 30.0, 25.0, 24.0, 15.0};
constexpr std::array kCharsets = {"UTF-8",        "WINDOWS-1250", "WINDOWS-1251", "WINDOWS-1252",
                                  "WINDOWS-1253", "WINDOWS-1254", "WINDOWS-1255", "WINDOWS-1256",
                                  "ISO-8859-1",   "ISO-8859-2",   "ISO-8859-15",  "KOI8-R",
                                  "GB18030",      "BIG5",         "SHIFT_JIS",    "EUC-KR"};

} // namespace

MoreSettings::MoreSettings(QWidget* parent) : QWidget(parent), more_(new QToolButton) {
    more_->setText(tr("M&ore"));
    more_->setCheckable(true);
    more_->setAutoRaise(true);
    more_->setArrowType(Qt::RightArrow);
    more_->setToolButtonStyle(Qt::ToolButtonTextBesideIcon);
    more_->setAccessibleDescription(tr("Shows or hides the settings that are seldom needed"));
    auto* rest = new QWidget;
    form_ = MakeForm();
    rest->setLayout(form_);
    rest->hide();
    connect(more_, &QToolButton::toggled, rest, [this, rest](bool open) {
        more_->setArrowType(open ? Qt::DownArrow : Qt::RightArrow);
        rest->setVisible(open);
    });
    QVBoxLayout* layout = MakeColumn(*this, 6);
    layout->addWidget(more_);
    layout->addWidget(rest);
    FillChoices();
    Connect();
}

QFormLayout* MoreSettings::MakeForm() {
    rate_ = new QComboBox;
    channels_ = new QComboBox;
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
    form->setFieldGrowthPolicy(QFormLayout::AllNonFixedFieldsGrow);
    form->setRowWrapPolicy(QFormLayout::WrapLongRows);
    form->setLabelAlignment(Qt::AlignRight | Qt::AlignVCenter);
    AddRow(*form, tr("Pictures a seco&nd"), rate_);
    AddRow(*form, tr("Sound channels"), channels_);
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
    return form;
}

void MoreSettings::FillChoices() {
    rate_->addItem(tr("As the source"));
    for (const double rate : kRates)
        rate_->addItem(QLocale().toString(rate, 'g', 4), rate);
    channels_->addItem(tr("As the preset has it"));
    channels_->addItem(tr("Mono"), 1);
    channels_->addItem(tr("Stereo"), 2);
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

void MoreSettings::Show(const Wishes& wishes, const MovieFacts* facts, bool copiesSound) {
    filling_ = true;
    wishes_ = wishes;
    ChooseItem(*rate_, DataOf(wishes.rate));
    ChooseItem(*channels_, DataOf(wishes.channels));
    channels_->setEnabled(!copiesSound);
    channels_->setToolTip(copiesSound ? tr("The sound stays as it is, and so do its channels.") : QString());
    channels_->setAccessibleDescription(channels_->toolTip());
    ChooseItem(*hdr_, static_cast<int>(wishes.hdr));
    form_->setRowVisible(hdr_, facts != nullptr && facts->hdr);
    ChooseItem(*depth_, DataOf(wishes.depth));
    if (charset_->findData(wishes.subtitleCharset) < 0)
        charset_->addItem(wishes.subtitleCharset, wishes.subtitleCharset);
    ChooseItem(*charset_, wishes.subtitleCharset);
    form_->setRowVisible(charset_, !wishes.subtitleFiles.empty() || !wishes.burning.file.empty());
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

void MoreSettings::Choose(const std::function<void(Wishes&)>& change) {
    if (filling_)
        return;
    Wishes wishes = wishes_;
    change(wishes);
    if (wishes != wishes_)
        Q_EMIT Chosen(wishes);
}

} // namespace movieconv::window
