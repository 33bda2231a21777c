// A text box that preserves every character of its text except those that the user edits.
#pragma once

#include <QPlainTextEdit>

namespace kest {

/// QPlainTextEdit turns every line end into a line feed and every no-break space into a space, and it is slow with
/// lines of millions of characters. This class remembers for each line end what it represents: a carriage return and a
/// line feed, only one of them, or nothing if a long line is shown in pieces. A line end that the user types is a
/// carriage return and a line feed.
class ExactTextEdit final : public QPlainTextEdit {
    Q_OBJECT
    Q_PROPERTY(QString exactText READ exactText)

public:
    explicit ExactTextEdit(QWidget* parent = nullptr);

    /// Replaces the text. Clears the undo history and the modified flag.
    void setExactText(const QString& text);
    /// Returns the text with its original line ends.
    QString exactText() const;

protected:
    void keyPressEvent(QKeyEvent* event) override;
    QMimeData* createMimeDataFromSelection() const override;
    void insertFromMimeData(const QMimeData* source) override;

private:
    QString exactText(int start, int end) const;

    QStringList joints;  // what the unusual line ends represent
};

}  // namespace kest
