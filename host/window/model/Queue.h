// The movies to convert, in their order: the list that the window shows and the journal keeps.
#ifndef MOVIECONV_HOST_WINDOW_MODEL_QUEUE_H
#define MOVIECONV_HOST_WINDOW_MODEL_QUEUE_H

#include "host/window/model/Inbox.h"
#include "host/window/model/Journal.h"
#include "host/window/model/Naming.h"
#include "host/window/model/TargetBook.h"
#include "host/window/model/Worker.h"

#include <QAbstractListModel>

#include <functional>
#include <memory>
#include <optional>
#include <string>
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
    /// By one place, up with -1 and down with 1; together, and not at all when one of them is at the end.
    void MoveBy(const QList<quint64>& ids, int by);
    /// In front of what stands in `row`, in their order.
    void MoveBefore(const QList<quint64>& ids, int row);

    /// Change an entry that is waiting; others are left alone.
    void SetWishes(quint64 id, const Wishes& wishes);
    /// What the user calls it: a name alone is beside the source, a missing extension is the format's. An
    /// empty path goes back to the naming rules.
    void SetTarget(quint64 id, const std::string& typed);
    void SetReplace(quint64 id, bool replace);
    /// Whether it replaces a file that exists: where that is wished, but for what another entry has become.
    bool MayReplace(const Entry& entry) const;
    /// Gives all that wait these wishes, but for what belongs to one movie alone.
    void SetWishesOfAll(const Wishes& wishes);
    /// Finds out anew whether a movie that could not be converted can be now.
    void LookAgain(quint64 id);
    /// Makes what is over wait again.
    void Retry(const QList<quint64>& ids);

    /// For entries whose targets the user has not named.
    void SetNaming(const Naming& naming);
    const Naming& CurrentNaming() const { return naming_; }
    /// What new entries start with.
    void SetDefaults(const Wishes& wishes) { defaults_ = wishes; }

    /// Changes an entry, tells and, with `keep`, writes the journal.
    void Change(quint64 id, const std::function<void(Entry&)>& change, bool keep);

    /// Asks the runner anew which presets there are.
    void FillPresets();
    /// The extension of the file that the wishes make.
    QString ExtensionFor(const Wishes& wishes) const;
    /// What the list says about an entry below its name.
    QString LineOf(const Entry& entry) const;

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
    /// Makes many changes one: when it ends, the journal is written once, Rearranged is told once, and all
    /// that have to be are examined.
    class Batch {
    public:
        explicit Batch(Queue& queue) : queue_(queue) { ++queue_.batches_; }
        Batch(const Batch&) = delete;
        Batch& operator=(const Batch&) = delete;
        ~Batch();

    private:
        Queue& queue_;
    };

    void Append(const std::vector<std::string>& movies);
    void RemoveRows(int first, int last);
    void Examine(quint64 id);
    void ExamineAmong(const std::shared_ptr<const TargetBook>& book, quint64 id);
    void TakeFound(const Entry& seen, const Entry& found);
    void AssignTarget(Entry& entry);
    void RenameForFormat(Entry& entry, const QString& before);
    void TakeFormatOf(const std::string& path, Wishes& wishes) const;
    QStringList KnownExtensions() const;
    void MoveTarget(Entry& entry, const std::string& path);
    void MakeRoomFor(const Entry& named);
    void MarkShared();
    void Keep();
    void TellRearranged();
    const PresetFacts* FindPreset(const QString& name) const;
    Entry* FindWaiting(quint64 id);
    void AfterEdit(quint64 id);

    Runner& runner_;
    Journal& journal_;
    std::vector<PresetFacts> presets_;
    std::vector<Entry> entries_;
    quint64 lastId_ = 0;
    Naming naming_;
    Wishes defaults_;
    int searches_ = 0;
    int batches_ = 0;
    /// While a batch gives out new ones.
    std::optional<TargetBook> taken_;
    bool keepAfter_ = false; // these three: when the batch ends
    bool tellAfter_ = false;
    QList<quint64> examineAfter_;
    Inbox inbox_;   // of the workers' results
    Worker finder_; // searches what is added: a movie that does not open holds up none of it
    Worker worker_; // looks at movies; both last: their tasks refer to the rest
};

} // namespace movieconv::window

#endif
