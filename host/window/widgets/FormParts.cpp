#include "host/window/widgets/FormParts.h"

namespace movieconv::window {

QLabel* MakeRowLabel(const QString& words, QWidget* field) {
    auto* label = new QLabel(words);
    label->setBuddy(field);
    label->setFixedHeight(field->sizeHint().height()); // also where more stands below the field
    return label;
}

void AddRow(QFormLayout& form, const QString& words, QWidget* field, const QString& description) {
    field->setAccessibleName(QString(words).remove(QLatin1Char('&')));
    if (!description.isEmpty()) {
        field->setToolTip(description);
        field->setAccessibleDescription(description);
    }
    form.addRow(MakeRowLabel(words, field), field);
}

} // namespace movieconv::window
