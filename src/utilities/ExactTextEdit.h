// A text box that gives back the very text that it was given, where nobody typed.
#pragma once

#include <QPlainTextEdit>

namespace kest {

/// Qt's own text box turns every line end into a line feed and every hard blank into a blank, and is slow on lines of
/// millions of characters. This one keeps, line by line, how the line is joined to the one before it: by a carriage
/// return and a line feed (as are lines that a person starts), by a single one of them, or, where it shows an overlong
/// line in pieces, by nothing.
class ExactTextEdit final : public QPlainTextEdit {
    Q_OBJECT
    Q_PROPERTY(QString exactText READ exactText)

public:
    explicit ExactTextEdit(QWidget* parent = nullptr);

    /// Puts the text there, unmodified, with nothing to undo.
    void setExactText(const QString& text);
    QString exactText() const;

private:
    QStringList joints;  // of the lines that are joined in another way than usual
};

}  // namespace kest
