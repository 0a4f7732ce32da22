// What the window asks in dialogs of their own.
#include "host/window/model/Intake.h"
#include "host/window/widgets/EntryPage.h"
#include "host/window/widgets/MainWindow.h"
#include "host/window/widgets/NamingDialog.h"

#include <QDir>
#include <QFileDialog>

#include <stdexcept>

namespace movieconv::window {
namespace {

std::vector<std::string> Bytes(const QStringList& paths) {
    std::vector<std::string> bytes;
    for (const QString& path : paths)
        bytes.push_back(path.toStdString());
    return bytes;
}

} // namespace

void MainWindow::OpenFiles() {
    const QStringList& extensions = MovieExtensions();
    const QString filter = tr("Movies and sound") + QStringLiteral(" (*.") +
                           extensions.join(QStringLiteral(" *.")) + QStringLiteral(");;") + tr("All files") +
                           QStringLiteral(" (*)");
    auto* dialog = new QFileDialog(this, tr("Open movies"), settings_.LoadFolder(), filter);
    dialog->setObjectName(QStringLiteral("openFiles"));
    dialog->setAttribute(Qt::WA_DeleteOnClose);
    dialog->setFileMode(QFileDialog::ExistingFiles);
    connect(dialog, &QFileDialog::filesSelected, this, [this, dialog](const QStringList& paths) {
        settings_.SaveFolder(dialog->directory().absolutePath());
        queue_.Add(Bytes(paths));
    });
    dialog->show();
}

void MainWindow::OpenFolder() {
    auto* dialog = new QFileDialog(this, tr("Open a folder with movies"), settings_.LoadFolder());
    dialog->setObjectName(QStringLiteral("openFolder"));
    dialog->setAttribute(Qt::WA_DeleteOnClose);
    dialog->setFileMode(QFileDialog::Directory);
    connect(dialog, &QFileDialog::filesSelected, this, [this](const QStringList& paths) {
        settings_.SaveFolder(paths.front());
        queue_.Add(Bytes(paths));
    });
    dialog->show();
}

void MainWindow::ShowNaming() {
    auto* dialog = new NamingDialog(queue_.CurrentNaming(), this);
    dialog->setAttribute(Qt::WA_DeleteOnClose);
    connect(dialog, &NamingDialog::Chosen, this, [this](const Naming& naming) {
        queue_.SetNaming(naming);
        settings_.Save(naming);
    });
    dialog->show();
}

void MainWindow::SavePreset(const Wishes& wishes) {
    auto* dialog =
        new QFileDialog(this, tr("Save the settings as a preset"), QString(), tr("Presets (*.json)"));
    dialog->setObjectName(QStringLiteral("savePreset"));
    dialog->setAttribute(Qt::WA_DeleteOnClose);
    dialog->setAcceptMode(QFileDialog::AcceptSave);
    dialog->setDefaultSuffix(QStringLiteral("json"));
    const QString folder = QString::fromStdString(runner_.PresetFolder());
    if (!folder.isEmpty() && QDir().mkpath(folder))
        dialog->setDirectory(folder);
    connect(dialog, &QFileDialog::fileSelected, this, [this, wishes](const QString& path) {
        try {
            const QStringList left = runner_.SavePreset(path.toStdString(), wishes);
            if (!left.isEmpty())
                Tell(tr("The preset is saved without what presets cannot hold: %1.")
                         .arg(left.join(QStringLiteral(", "))));
            entryPage_->FillPresets();
            queue_.FillPresets();
            ShowEntry();
        } catch (const std::runtime_error& error) {
            Tell(QString::fromUtf8(error.what()));
        }
    });
    dialog->show();
}

void MainWindow::LoadPreset(quint64 id) {
    auto* dialog = new QFileDialog(this, tr("Load a preset"), QString(), tr("Presets (*.json)"));
    dialog->setObjectName(QStringLiteral("loadPreset"));
    dialog->setAttribute(Qt::WA_DeleteOnClose);
    dialog->setFileMode(QFileDialog::ExistingFile);
    connect(dialog, &QFileDialog::fileSelected, this, [this, id](const QString& path) {
        try {
            const PresetFacts preset = runner_.LoadPreset(path.toStdString());
            for (const QString& complaint : preset.complaints)
                Tell(complaint);
            entryPage_->FillPresets();
            queue_.FillPresets();
            Wishes wishes;
            wishes.preset = preset.name;
            if (const Entry* entry = queue_.Find(id))
                queue_.SetWishes(id, WithOwn(wishes, entry->wishes));
            ShowEntry();
        } catch (const std::runtime_error& error) {
            Tell(QString::fromUtf8(error.what()));
        }
    });
    dialog->show();
}

} // namespace movieconv::window
