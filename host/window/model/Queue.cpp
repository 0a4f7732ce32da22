#include "host/window/model/Queue.h"

#include "host/window/model/Intake.h"
#include "host/window/model/Words.h"

#include <QSet>

#include <algorithm>
#include <filesystem>
#include <utility>

namespace movieconv::window {

Queue::Queue(Runner& runner, Journal& journal, QObject* parent)
    : QAbstractListModel(parent), runner_(runner), journal_(journal), presets_(runner.Presets()) {}

Queue::~Queue() = default;

QString Queue::Restore() {
    QString complaint;
    std::vector<Entry> kept = journal_.Load(complaint);
    beginResetModel();
    entries_ = std::move(kept);
    for (Entry& entry : entries_)
        entry.id = ++lastId_;
    endResetModel();
    const Batch batch(*this);
    TellRearranged();
    for (const Entry& entry : entries_)
        if (entry.state == State::kWaiting || entry.state == State::kInterrupted)
            Examine(entry.id);
    return complaint;
}

const Entry* Queue::Find(quint64 id) const {
    const int row = RowOf(id);
    return row < 0 ? nullptr : &entries_[static_cast<size_t>(row)];
}

int Queue::RowOf(quint64 id) const {
    const auto found =
        std::find_if(entries_.begin(), entries_.end(), [&](const Entry& entry) { return entry.id == id; });
    return found == entries_.end() ? -1 : static_cast<int>(found - entries_.begin());
}

void Queue::Add(std::vector<std::string> paths) {
    ++searches_;
    finder_.Do(0, [this, paths = std::move(paths)] {
        QStringList complaints;
        std::vector<std::string> movies = FindMovies(paths, complaints);
        inbox_.Put([this, movies = std::move(movies), complaints] {
            --searches_;
            Append(movies);
            for (const QString& complaint : complaints)
                Q_EMIT Complaint(complaint);
        });
    });
}

void Queue::Append(const std::vector<std::string>& movies) {
    if (movies.empty()) {
        TellRearranged();
        return;
    }
    const Batch batch(*this);
    const int first = static_cast<int>(entries_.size());
    beginInsertRows({}, first, first + static_cast<int>(movies.size()) - 1);
    for (const std::string& movie : movies) {
        Entry entry;
        entry.id = ++lastId_;
        entry.source = movie;
        entry.wishes = defaults_;
        AssignTarget(entry);
        entries_.push_back(std::move(entry));
    }
    endInsertRows();
    Keep();
    TellRearranged();
    for (auto row = static_cast<size_t>(first); row < entries_.size(); ++row)
        Examine(entries_[row].id);
}

void Queue::Remove(const QList<quint64>& ids) {
    const QSet<quint64> meant(ids.begin(), ids.end());
    const auto goes = [&](int row) {
        const Entry& entry = entries_[static_cast<size_t>(row)];
        return entry.state != State::kActive && meant.contains(entry.id);
    };
    const Batch batch(*this);
    int last = rowCount() - 1;
    while (last >= 0) {
        int first = last;
        while (first >= 0 && goes(first))
            --first;
        if (first < last)
            RemoveRows(first + 1, last);
        last = first - 1; // which stays
    }
}

void Queue::RemoveRows(int first, int last) {
    beginRemoveRows({}, first, last);
    entries_.erase(entries_.begin() + first, entries_.begin() + last + 1);
    endRemoveRows();
    Keep();
    TellRearranged();
}

void Queue::RemoveOver() {
    QList<quint64> ids;
    for (const Entry& entry : entries_)
        if (entry.IsOver())
            ids.append(entry.id);
    Remove(ids);
}

void Queue::Move(quint64 id, int row) {
    const int from = RowOf(id);
    const int to = std::clamp(row, 0, static_cast<int>(entries_.size()) - 1);
    if (from >= 0 && from != to)
        moveRows({}, from, 1, {}, to > from ? to + 1 : to);
}

void Queue::MoveBy(const QList<quint64>& ids, int by) {
    QList<int> rows;
    for (const quint64 id : ids)
        rows.append(RowOf(id));
    std::sort(rows.begin(), rows.end());
    const int edge = by > 0 ? rowCount() - 1 : 0;
    if (rows.isEmpty() || rows.front() < 0 || (by > 0 ? rows.back() : rows.front()) == edge)
        return;
    if (by > 0)
        std::reverse(rows.begin(), rows.end());
    const Batch batch(*this);
    for (const int row : rows)
        Move(entries_[static_cast<size_t>(row)].id, row + by);
}

void Queue::MoveBefore(const QList<quint64>& ids, int row) {
    const Batch batch(*this);
    int before = row;
    for (qsizetype begin = 0, end = 0; begin < ids.size(); begin = end) {
        const int first = RowOf(ids[begin]);
        if (first < 0)
            return;
        int next = first;
        for (; end < ids.size() && next < rowCount() && entries_[static_cast<size_t>(next)].id == ids[end];
             ++end)
            ++next;
        moveRows({}, first, next - first, {}, before);
        before = RowOf(ids[end - 1]) + 1;
    }
}

bool Queue::moveRows(const QModelIndex& from, int first, int count, const QModelIndex& to, int before) {
    const int end = first + count;
    if (count < 1 || first < 0 || end > rowCount() || before < 0 || before > rowCount() ||
        !beginMoveRows(from, first, end - 1, to, before))
        return false;
    const auto begin = entries_.begin();
    if (before < first)
        std::rotate(begin + before, begin + first, begin + end);
    else
        std::rotate(begin + first, begin + end, begin + before);
    endMoveRows();
    Keep();
    TellRearranged();
    return true;
}

void Queue::SetWishes(quint64 id, const Wishes& wishes) {
    Entry* entry = FindWaiting(id);
    if (entry == nullptr || entry->wishes == wishes)
        return;
    const Batch batch(*this);
    const QString before = ExtensionFor(entry->wishes);
    entry->wishes = wishes;
    if (entry->targetNamed)
        RenameForFormat(*entry, before);
    else
        AssignTarget(*entry);
    AfterEdit(id);
}

/// The file's format follows its name.
void Queue::RenameForFormat(Entry& entry, const QString& before) {
    const QString extension = ExtensionFor(entry.wishes);
    if (extension == before)
        return;
    entry.replace = false;
    MoveTarget(entry, WithExtension(entry.target, extension, KnownExtensions()));
    MakeRoomFor(entry);
}

QStringList Queue::KnownExtensions() const {
    QStringList known = MovieExtensions();
    for (const FormatFacts& format : runner_.Formats())
        known += format.extension;
    return known;
}

void Queue::SetTarget(quint64 id, const std::string& typed) {
    Entry* entry = FindWaiting(id);
    if (entry == nullptr)
        return;
    const std::string path =
        typed.empty() ? std::string()
                      : CompletePath(typed, *entry, ExtensionFor(entry->wishes), KnownExtensions());
    if (entry->targetNamed && entry->target == path)
        return Change(
            id, [](Entry&) {}, false); // it may be shown as it was typed
    const Batch batch(*this);
    entry->targetNamed = !path.empty();
    entry->replace = false;
    if (path.empty())
        AssignTarget(*entry);
    else
        MoveTarget(*entry, path);
    TakeFormatOf(path, entry->wishes);
    AfterEdit(id);
    MakeRoomFor(*entry);
}

/// A typed extension tells the format, too.
void Queue::TakeFormatOf(const std::string& path, Wishes& wishes) const {
    const QString extension =
        QString::fromStdString(std::filesystem::path(path).extension().string()).mid(1).toLower();
    const std::vector<FormatFacts> formats = runner_.Formats();
    const auto format = std::find_if(formats.begin(), formats.end(), [&](const FormatFacts& each) {
        return each.extension == extension || each.furtherExtensions.contains(extension);
    });
    if (format == formats.end() || format->extension == ExtensionFor(wishes))
        return;
    wishes.format.reset();
    if (format->extension != ExtensionFor(wishes))
        wishes.format = format->extension;
}

void Queue::SetReplace(quint64 id, bool replace) {
    Entry* entry = FindWaiting(id);
    if (entry == nullptr || entry->replace == replace)
        return;
    entry->replace = replace;
    AfterEdit(id);
}

void Queue::SetWishesOfAll(const Wishes& wishes) {
    const Batch batch(*this);
    for (const Entry& entry : entries_)
        SetWishes(entry.id, WithOwn(wishes, entry.wishes));
}

void Queue::LookAgain(quint64 id) {
    if (const Entry* entry = FindWaiting(id); entry == nullptr || entry->unusable.isEmpty())
        return;
    Change(
        id,
        [](Entry& entry) {
            entry.facts.reset();
            entry.unusable.clear();
            entry.examined = false;
        },
        false);
    Examine(id);
}

void Queue::Retry(const QList<quint64>& ids) {
    const Batch batch(*this);
    for (const quint64 id : ids) {
        const Entry* entry = Find(id);
        if (entry == nullptr || !entry->IsOver())
            continue;
        Change(
            id,
            [](Entry& again) {
                again.state = State::kWaiting;
                again.facts.reset(); // it may be another movie by now, or none
                again.examined = false;
                again.figures = {};
                again.outcome = {};
                again.notes.clear();
            },
            true);
        Examine(id);
    }
}

void Queue::SetNaming(const Naming& naming) {
    if (naming == naming_)
        return;
    naming_ = naming;
    const Batch batch(*this);
    for (Entry& entry : entries_) {
        if (entry.state != State::kWaiting || entry.targetNamed)
            continue;
        AssignTarget(entry);
        AfterEdit(entry.id);
    }
}

void Queue::Change(quint64 id, const std::function<void(Entry&)>& change, bool keep) {
    const int row = RowOf(id);
    if (row < 0)
        return;
    change(entries_[static_cast<size_t>(row)]);
    if (keep)
        Keep();
    Q_EMIT dataChanged(index(row), index(row));
    Q_EMIT Changed(id);
}

void Queue::FillPresets() {
    presets_ = runner_.Presets();
}

QString Queue::ExtensionFor(const Wishes& wishes) const {
    if (wishes.format)
        return *wishes.format;
    const PresetFacts* preset = FindPreset(wishes.preset);
    return preset == nullptr ? QStringLiteral("mp4") : preset->extension;
}

QString Queue::LineOf(const Entry& entry) const {
    const PresetFacts* preset = FindPreset(entry.wishes.preset);
    return StateLine(entry, preset == nullptr ? entry.wishes.preset : preset->title);
}

const PresetFacts* Queue::FindPreset(const QString& name) const {
    const auto found = std::find_if(presets_.begin(), presets_.end(),
                                    [&](const PresetFacts& facts) { return facts.name == name; });
    return found == presets_.end() ? nullptr : &*found;
}

int Queue::rowCount(const QModelIndex& parent) const {
    return parent.isValid() ? 0 : static_cast<int>(entries_.size());
}

QVariant Queue::data(const QModelIndex& index, int role) const {
    if (!index.isValid() || index.row() >= rowCount())
        return {};
    const Entry& entry = entries_[static_cast<size_t>(index.row())];
    switch (role) {
    case Qt::DisplayRole:
        return NameOf(entry.source);
    case Qt::ToolTipRole:
        return ForToolTip(Shown(entry.source));
    case Qt::AccessibleTextRole:
        return QStringLiteral("%1, %2").arg(NameOf(entry.source), LineOf(entry));
    case kIdRole:
        return entry.id;
    default:
        return {};
    }
}

Qt::ItemFlags Queue::flags(const QModelIndex& index) const {
    return index.isValid()
               ? Qt::ItemIsSelectable | Qt::ItemIsEnabled | Qt::ItemIsDragEnabled | Qt::ItemNeverHasChildren
               : Qt::ItemIsDropEnabled;
}

void Queue::Keep() {
    keepAfter_ = true;
    const Batch batch(*this);
}

void Queue::TellRearranged() {
    tellAfter_ = true;
    const Batch batch(*this);
}

Queue::Batch::~Batch() {
    if (--queue_.batches_ > 0)
        return;
    queue_.taken_.reset();
    if (std::exchange(queue_.keepAfter_, false))
        queue_.journal_.Keep(queue_.entries_);
    if (const QList<quint64> ids = std::exchange(queue_.examineAfter_, {}); !ids.isEmpty()) {
        const auto book = std::make_shared<const TargetBook>(queue_.entries_);
        for (const quint64 id : ids)
            queue_.ExamineAmong(book, id);
    }
    queue_.MarkShared();
    if (std::exchange(queue_.tellAfter_, false))
        Q_EMIT queue_.Rearranged();
}

Entry* Queue::FindWaiting(quint64 id) {
    const int row = RowOf(id);
    Entry* entry = row < 0 ? nullptr : &entries_[static_cast<size_t>(row)];
    return entry != nullptr && entry->state == State::kWaiting ? entry : nullptr;
}

void Queue::AfterEdit(quint64 id) {
    Change(
        id, [](Entry& entry) { entry.examined = false; }, true);
    Examine(id);
}

} // namespace movieconv::window
