#include "host/window/widgets/BurnChoice.h"

#include "host/window/model/Entry.h"
#include "host/window/model/Words.h"
#include "host/window/widgets/FormParts.h"

#include <QFileDialog>
#include <QHBoxLayout>
#include <QPushButton>

namespace movieconv::window {
namespace {

constexpr int kNone = -1; // beside the numbers of tracks
constexpr int kFile = -2;

} // namespace

BurnChoice::BurnChoice(QWidget* parent) : QWidget(parent), box_(new QComboBox) {
    AllowNarrow(*box_);
    box_->setAccessibleName(tr("Subtitles drawn into the pictures"));
    box_->setToolTip(tr("They are seen on every player and cannot be switched off."));
    box_->setAccessibleDescription(box_->toolTip());
    auto* file = new QPushButton(tr("A file…"));
    file->setAccessibleName(tr("Draw the subtitles of a file"));
    auto* label = new QLabel(tr("Dra&wn in"));
    label->setBuddy(box_);
    auto* row = new QHBoxLayout(this);
    row->setContentsMargins(0, 0, 0, 0);
    row->addWidget(label);
    row->addWidget(box_, 1);
    row->addWidget(file);
    connect(file, &QPushButton::clicked, this, &BurnChoice::Browse);
    connect(box_, &QComboBox::activated, this, [this] {
        const int choice = box_->currentData().toInt();
        Burning burning;
        if (choice == kFile)
            burning.file = file_;
        else if (choice != kNone)
            burning.track = choice;
        Q_EMIT Chosen(burning);
    });
}

void BurnChoice::Show(const std::vector<TrackFacts>& tracks, const Burning& burning,
                      const std::string& movie) {
    movie_ = movie;
    if (!burning.file.empty())
        file_ = burning.file;
    box_->clear();
    box_->addItem(tr("No subtitles"), kNone);
    for (const TrackFacts& track : tracks)
        box_->addItem(TrackLine(track), track.number);
    if (!burning.file.empty())
        box_->addItem(NameOf(file_), kFile);
    ChooseItem(*box_, burning.track.value_or(burning.file.empty() ? kNone : kFile));
}

void BurnChoice::Browse() {
    QFileDialog* dialog = OpenSubtitles(*this, tr("Draw subtitles"), movie_);
    dialog->setFileMode(QFileDialog::ExistingFile);
    connect(dialog, &QFileDialog::fileSelected, this, [this](const QString& path) {
        Burning burning;
        burning.file = path.toStdString();
        Q_EMIT Chosen(burning);
    });
    dialog->show();
}

} // namespace movieconv::window
