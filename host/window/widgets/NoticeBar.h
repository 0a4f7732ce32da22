// News that need no answer at once: lines above the queue with what can be done about each.
#ifndef MOVIECONV_HOST_WINDOW_WIDGETS_NOTICEBAR_H
#define MOVIECONV_HOST_WINDOW_WIDGETS_NOTICEBAR_H

#include <QWidget>

#include <functional>
#include <utility>
#include <vector>

class QVBoxLayout;

namespace movieconv::window {

class NoticeBar : public QWidget {
    Q_OBJECT
public:
    /// What can be done: the words on the button and the deed, after which the notice goes.
    using Choice = std::pair<QString, std::function<void()>>;

    explicit NoticeBar(QWidget* parent = nullptr);

    /// Shows a notice; one of the same `key` is replaced. It stays until it is dismissed or chosen from.
    void Show(const QString& key, const QString& sentence, const std::vector<Choice>& choices = {});
    void Dismiss(const QString& key);
    bool Shows(const QString& key) const;

private:
    static constexpr int kMost = 4;

    QVBoxLayout* const rows_;
};

} // namespace movieconv::window

#endif
