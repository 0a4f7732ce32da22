// What the pages' forms are made of.
#ifndef MOVIECONV_HOST_WINDOW_WIDGETS_FORMPARTS_H
#define MOVIECONV_HOST_WINDOW_WIDGETS_FORMPARTS_H

#include <QComboBox>
#include <QFormLayout>
#include <QLabel>
#include <QVBoxLayout>
#include <QVariant>

#include <algorithm>
#include <optional>
#include <string>

class QFileDialog;

namespace movieconv::window {

/// Chooses the item with this data; the first one when there is none.
inline void ChooseItem(QComboBox& box, const QVariant& data) {
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

/// A control changes by the wheel only while it has the focus: over others the wheel moves the page.
void LeaveWheelToPage(QWidget& control);
/// Likewise for all that there is below `page`.
void LeaveWheelToPageBelow(QWidget& page);

/// Lets the Tab key go through the controls below `page` in the order of its layouts; those that came later
/// are the last ones else.
void OrderTabs(QWidget& page);

/// A layout for `owner` that lies flush with what is around it.
QVBoxLayout* MakeColumn(QWidget& owner, int spacing);

/// Lets a box become narrower than its longest item.
void AllowNarrow(QComboBox& box);

/// Asks for files of subtitles, first beside the movie. Not shown yet; deletes itself when it is closed.
QFileDialog* OpenSubtitles(QWidget& parent, const QString& title, const std::string& movie);

/// A row whose label names the field, with a key where `words` has one, to screen readers too.
void AddRow(QFormLayout& form, const QString& words, QWidget* field, const QString& description = {});

/// The label of a row whose field is as high as `field`, in the middle beside it.
QLabel* MakeRowLabel(const QString& words, QWidget* field);

} // namespace movieconv::window

#endif
