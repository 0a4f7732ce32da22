// What the queue finds out about its movies, and the names that their files get.
#include "host/window/model/Queue.h"

#include <QDate>

#include <algorithm>
#include <memory>
#include <stdexcept>
#include <string>

namespace movieconv::window {

/// Finds out what the movie is, whether its target's name is free, and what stands in the way.
void Queue::Examine(quint64 id) {
    examineAfter_.append(id);
    const Batch batch(*this); // perhaps within another one
}

void Queue::ExamineAmong(const std::shared_ptr<const TargetBook>& book, quint64 id) {
    const Entry* entry = Find(id);
    if (entry == nullptr)
        return;
    worker_.Do(id, [this, book, seen = *entry, naming = naming_, extension = ExtensionFor(entry->wishes),
                    today = QDate::currentDate()] {
        Entry found = seen;
        try {
            if (!found.facts)
                found.facts = runner_.Look(found.source);
            if (!found.targetNamed && found.state == State::kWaiting) {
                found.target = TargetFor(found, naming, extension, today, [&](const std::string& path) {
                    return book->IsTaken(path, seen) ||
                           !runner_.FileInTheWay({found.source, path, found.wishes, false, *found.facts})
                                .empty();
                });
            }
            found.findings =
                runner_.Check({found.source, found.target, found.wishes, found.replace, *found.facts});
            found.unusable.clear();
        } catch (const std::runtime_error& error) {
            found.unusable = QString::fromUtf8(error.what());
        }
        inbox_.Put([this, seen, found] { TakeFound(seen, found); });
    });
}

void Queue::TakeFound(const Entry& seen, const Entry& found) {
    const Entry* now = Find(seen.id);
    if (now == nullptr || now->state != seen.state || now->wishes != seen.wishes ||
        now->target != seen.target || now->replace != seen.replace)
        return; // edited meanwhile, and so examined again
    if (!found.targetNamed && TargetBook(entries_).IsTaken(found.target, *now)) {
        Examine(seen.id);
        return;
    }
    Change(
        seen.id,
        [&](Entry& known) {
            known.facts = found.facts;
            known.target = found.target;
            known.findings = found.findings;
            known.unusable = found.unusable;
            known.examined = true;
        },
        found.target != seen.target);
}

/// By the rules, and apart from the other entries' targets; whether there is such a file is found out later.
void Queue::AssignTarget(Entry& entry) {
    const Batch batch(*this);
    if (!taken_)
        taken_.emplace(entries_);
    MoveTarget(entry, TargetFor(entry, naming_, ExtensionFor(entry.wishes), QDate::currentDate(),
                                [&](const std::string& path) { return taken_->IsTaken(path, entry); }));
}

void Queue::MoveTarget(Entry& entry, const std::string& path) {
    if (taken_)
        taken_->Move(entry.target, path);
    entry.target = path;
}

/// A name that the user gives one movie is not another one's by the rules any more.
void Queue::MakeRoomFor(const Entry& named) {
    for (Entry& other : entries_) {
        if (other.id == named.id || other.targetNamed || other.state != State::kWaiting ||
            other.target != named.target)
            continue;
        AssignTarget(other);
        AfterEdit(other.id);
    }
}

void Queue::MarkShared() {
    const TargetBook book(entries_);
    for (const Entry& entry : entries_) {
        const bool shared = book.IsShared(entry.target);
        if (entry.targetShared != shared)
            Change(
                entry.id, [shared](Entry& known) { known.targetShared = shared; }, false);
    }
}

bool Queue::MayReplace(const Entry& entry) const {
    return entry.replace && std::none_of(entries_.begin(), entries_.end(), [&](const Entry& other) {
               return other.id != entry.id && other.target == entry.target && !other.outcome.files.empty();
           });
}

} // namespace movieconv::window
