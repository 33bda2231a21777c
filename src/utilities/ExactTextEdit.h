// A text box that gives back the very text that it was given, but for what a person changed.
#pragma once

#include <QPlainTextEdit>

namespace kest {

/// Qt's own text box turns every line end into a line feed and every hard blank into a blank, and is slow on lines of
/// millions of characters. This one keeps with each line end what it stands for: a carriage return and a line feed (as
/// do those that a person puts in), a single one of them, or, where an overlong line is shown in pieces, nothing.
class ExactTextEdit final : public QPlainTextEdit {
    Q_OBJECT
    Q_PROPERTY(QString exactText READ exactText)

public:
    explicit ExactTextEdit(QWidget* parent = nullptr);

    /// Puts the text there, unmodified, with nothing to undo.
    void setExactText(const QString& text);
    QString exactText() const;

protected:
    void keyPressEvent(QKeyEvent* event) override;
    QMimeData* createMimeDataFromSelection() const override;
    void insertFromMimeData(const QMimeData* source) override;

private:
    QString exactText(int start, int end) const;

    QStringList joints;  // what the line ends stand for that are other than usual
};

}  // namespace kest
