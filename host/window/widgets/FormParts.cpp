#include "host/window/widgets/FormParts.h"

#include "host/window/model/Entry.h"
#include "text/Path.h"

#include <QAbstractSpinBox>
#include <QCoreApplication>
#include <QEvent>
#include <QFileDialog>
#include <QSlider>

namespace movieconv::window {
namespace {

struct Texts {
    Q_DECLARE_TR_FUNCTIONS(FormParts)
};

class WheelGuard : public QObject {
public:
    using QObject::QObject;

    bool eventFilter(QObject* watched, QEvent* event) override {
        if (event->type() != QEvent::Wheel || static_cast<QWidget*>(watched)->hasFocus())
            return false;
        event->ignore(); // and so it comes to the page
        return true;
    }
};

void CollectControls(const QLayout& layout, QList<QWidget*>& controls) {
    for (int i = 0; i < layout.count(); ++i) {
        QLayoutItem* item = layout.itemAt(i);
        QWidget* widget = item->widget();
        if (widget != nullptr && (widget->focusPolicy() & Qt::TabFocus) != 0)
            controls += widget;
        else if (const QLayout* inner = widget != nullptr ? widget->layout() : item->layout())
            CollectControls(*inner, controls);
    }
}

} // namespace

void OrderTabs(QWidget& page) {
    QList<QWidget*> controls;
    CollectControls(*page.layout(), controls);
    for (qsizetype i = 1; i < controls.size(); ++i)
        QWidget::setTabOrder(controls[i - 1], controls[i]);
}

void LeaveWheelToPage(QWidget& control) {
    control.setFocusPolicy(Qt::StrongFocus);
    control.installEventFilter(new WheelGuard(&control));
}

void LeaveWheelToPageBelow(QWidget& page) {
    for (QWidget* widget : page.findChildren<QWidget*>())
        if (qobject_cast<QComboBox*>(widget) != nullptr ||
            qobject_cast<QAbstractSpinBox*>(widget) != nullptr || qobject_cast<QSlider*>(widget) != nullptr)
            LeaveWheelToPage(*widget);
}

QVBoxLayout* MakeColumn(QWidget& owner, int spacing) {
    auto* column = new QVBoxLayout(&owner);
    column->setContentsMargins(0, 0, 0, 0);
    column->setSpacing(spacing);
    return column;
}

void AllowNarrow(QComboBox& box) {
    constexpr int kLetters = 10;
    box.setSizeAdjustPolicy(QComboBox::AdjustToMinimumContentsLengthWithIcon);
    box.setMinimumContentsLength(kLetters);
}

QFileDialog* OpenSubtitles(QWidget& parent, const QString& title, const std::string& movie) {
    auto* dialog =
        new QFileDialog(&parent, title, Readable(text::FolderOf(movie)),
                        Texts::tr("Subtitles") + QStringLiteral(" (*.srt *.ass *.ssa *.vtt *.sub *.txt);;") +
                            Texts::tr("All files") + QStringLiteral(" (*)"));
    dialog->setObjectName(QStringLiteral("openSubtitles"));
    dialog->setAttribute(Qt::WA_DeleteOnClose);
    dialog->setFileMode(QFileDialog::ExistingFiles);
    return dialog;
}

QLabel* MakeRowLabel(const QString& words, QWidget* field) {
    auto* label = new QLabel(words);
    label->setBuddy(field);
    label->setFixedHeight(field->sizeHint().height()); // also where more stands below the field
    return label;
}

void AddRow(QFormLayout& form, const QString& words, QWidget* field, const QString& description) {
    field->setAccessibleName(QString(words).remove(QLatin1Char('&')));
    if (auto* box = qobject_cast<QComboBox*>(field))
        AllowNarrow(*box);
    if (!description.isEmpty()) {
        field->setToolTip(description);
        field->setAccessibleDescription(description);
    }
    form.addRow(MakeRowLabel(words, field), field);
}

} // namespace movieconv::window
