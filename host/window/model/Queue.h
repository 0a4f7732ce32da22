// The movies to convert, in their order: the list that the window shows and the journal keeps.
#ifndef MOVIECONV_HOST_WINDOW_MODEL_QUEUE_H
#define MOVIECONV_HOST_WINDOW_MODEL_QUEUE_H

#include "host/window/model/Inbox.h"
#include "host/window/model/Journal.h"
#include "host/window/model/Naming.h"
#include "host/window/model/Worker.h"

#include <QAbstractListModel>

#include <functional>
#include <vector>

namespace movieconv::window {

/// Belongs to the window's thread. What touches disks happens on a worker; its results come in later.
class Queue : public QAbstractListModel {
    Q_OBJECT
public:
    enum Role { kIdRole = Qt::UserRole };

    /// `runner` and `journal` must outlive the queue.
    Queue(Runner& runner, Journal& journal, QObject* parent = nullptr);
    ~Queue() override;

    /// Takes over what the journal holds. Gives a sentence when something was wrong with it.
    QString Restore();

    const std::vector<Entry>& Entries() const { return entries_; }
    /// Null when there is none.
    const Entry* Find(quint64 id) const;
    /// -1 when there is none.
    int RowOf(quint64 id) const;

    /// Adds movies, and the movies in folders and below; they appear as they are found.
    void Add(std::vector<std::string> paths);
    /// Whether something that was added is still being looked for.
    bool IsSearching() const { return searches_ > 0; }
    /// Entries that are being converted stay.
    void Remove(const QList<quint64>& ids);
    /// All that are done, stopped or failed.
    void RemoveOver();
    /// So that it stands in `row`.
    void Move(quint64 id, int row);

    /// Change an entry that is waiting; others are left alone.
    void SetWishes(quint64 id, const Wishes& wishes);
    /// An empty path goes back to the naming rules.
    void SetTarget(quint64 id, const std::string& path);
    void SetReplace(quint64 id, bool replace);
    /// Makes what is over wait again.
    void Retry(const QList<quint64>& ids);

    /// For entries whose targets the user has not named.
    void SetNaming(const Naming& naming);
    const Naming& CurrentNaming() const { return naming_; }
    /// What new entries start with.
    void SetDefaults(const Wishes& wishes) { defaults_ = wishes; }
    const Wishes& Defaults() const { return defaults_; }

    /// Changes an entry, tells and, with `keep`, writes the journal.
    void Change(quint64 id, const std::function<void(Entry&)>& change, bool keep);

    /// Asks the runner anew which presets there are.
    void FillPresets();
    /// The extension of the file that the wishes make.
    QString ExtensionFor(const Wishes& wishes) const;

    int rowCount(const QModelIndex& parent = {}) const override;
    QVariant data(const QModelIndex& index, int role) const override;
    Qt::ItemFlags flags(const QModelIndex& index) const override;
    Qt::DropActions supportedDropActions() const override { return Qt::MoveAction | Qt::CopyAction; }
    bool moveRows(const QModelIndex& from, int first, int count, const QModelIndex& to, int before) override;

Q_SIGNALS:
    void Changed(quint64 id);
    /// Movies came, went, or changed places.
    void Rearranged();
    /// Something was added that holds no movie, or the journal cannot be written.
    void Complaint(const QString& sentence);

private:
    void Append(const std::vector<std::string>& movies);
    void Examine(quint64 id);
    void AssignTarget(Entry& entry);
    void Keep();
    Entry* FindWaiting(quint64 id);
    void AfterEdit(quint64 id);
    bool IsTakenByOther(const Entry& entry, const std::string& path) const;

    Runner& runner_;
    Journal& journal_;
    std::vector<PresetFacts> presets_;
    std::vector<Entry> entries_;
    quint64 lastId_ = 0;
    Naming naming_;
    Wishes defaults_;
    int searches_ = 0;
    Inbox inbox_;   // of the worker's results
    Worker worker_; // last: its tasks refer to the rest
};

} // namespace movieconv::window

#endif
