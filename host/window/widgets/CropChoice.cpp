#include "host/window/widgets/CropChoice.h"

#include "host/window/widgets/FormParts.h"

#include <QGridLayout>
#include <QSpinBox>

#include <algorithm>

namespace movieconv::window {
namespace {

enum Way { kNothing, kBorders, kByHand };

} // namespace

CropChoice::CropChoice(QWidget* parent) : QWidget(parent), box_(new QComboBox), margins_(new QWidget) {
    AllowNarrow(*box_);
    box_->setAccessibleName(tr("Crop"));
    box_->addItem(tr("Nothing"), kNothing);
    box_->addItem(tr("Black borders"), kBorders);
    box_->addItem(tr("By hand"), kByHand);
    auto* margins = new QGridLayout(margins_);
    margins->setContentsMargins(0, 0, 0, 0);
    const std::array words = {tr("above"), tr("below"), tr("left"), tr("right")};
    for (size_t side = 0; side < sides_.size(); ++side) {
        auto* pixels = new QSpinBox;
        pixels->setSingleStep(2);
        pixels->setAccessibleName(tr("Pixels to cut off: %1").arg(words[side]));
        connect(pixels, &QSpinBox::valueChanged, this, &CropChoice::Tell);
        sides_[side] = pixels;
        const int row = static_cast<int>(side / 2);
        const int column = static_cast<int>(side % 2) * 2;
        margins->addWidget(new QLabel(words[side]), row, column);
        margins->addWidget(pixels, row, column + 1);
    }
    margins->setColumnStretch(4, 1);
    QVBoxLayout* layout = MakeColumn(*this, 6);
    layout->addWidget(box_);
    layout->addWidget(margins_);
    connect(box_, &QComboBox::activated, this, &CropChoice::Tell);
}

void CropChoice::Show(const Wishes& wishes, const MovieFacts* facts) {
    filling_ = true;
    const Margins cut = wishes.cut.value_or(Margins{});
    const std::array values = {cut.top, cut.bottom, cut.left, cut.right};
    const std::array opposite = {cut.bottom, cut.top, cut.right, cut.left};
    constexpr int kLeast = 16; // pixels that have to be left
    for (size_t side = 0; side < sides_.size(); ++side) {
        const int whole = facts == nullptr ? 0 : side < 2 ? facts->height : facts->width;
        sides_[side]->setMaximum(std::max({0, values[side], whole - opposite[side] - kLeast}));
        sides_[side]->setValue(values[side]);
    }
    ChooseItem(*box_, wishes.cut ? kByHand : wishes.crop ? kBorders : kNothing);
    margins_->setVisible(wishes.cut.has_value());
    filling_ = false;
}

void CropChoice::Tell() {
    if (filling_)
        return;
    const int way = box_->currentData().toInt();
    std::optional<Margins> cut;
    if (way == kByHand)
        cut = Margins{sides_[0]->value(), sides_[1]->value(), sides_[2]->value(), sides_[3]->value()};
    Q_EMIT Chosen(way == kBorders, cut);
}

} // namespace movieconv::window
