#include "utilities/ExactTextEdit.h"

#include <QTextBlock>
#include <QTextBlockFormat>

using namespace Qt::StringLiterals;

namespace kest {

namespace {

constexpr qsizetype longestLine = 4000;  // characters; a document in base64 may stand in one line of millions
constexpr auto usualJoint = "\r\n"_L1;
constexpr int jointIndex = QTextFormat::UserProperty;  // into `joints`; each is given to one line only

/// The characters at which Qt starts a new line of a plain text.
bool endsLine(QChar c)
{
    return c == u'\r' || c == u'\n' || c == QChar::ParagraphSeparator || c == u'\xfdd0' || c == u'\xfdd1';
}

/// One line as it is shown, and what joins it to the one before.
struct Line {
    QStringView characters;
    QStringView jointBefore;
};

QList<Line> linesOf(QStringView text)
{
    QList<Line> lines;
    QStringView jointBefore;
    while (true) {
        const auto limit = text.begin() + qMin(text.size(), longestLine);
        const qsizetype end = std::find_if(text.begin(), limit, endsLine) - text.begin();
        lines.append({text.first(end), jointBefore});
        if (end == text.size())
            return lines;
        const qsizetype length = !endsLine(text[end]) ? 0 : text.sliced(end).startsWith(usualJoint) ? 2 : 1;
        jointBefore = text.sliced(end, length);
        text = text.sliced(end + length);
    }
}

}  // namespace

ExactTextEdit::ExactTextEdit(QWidget* parent) : QPlainTextEdit(parent) {}

void ExactTextEdit::setExactText(const QString& text)
{
    const QList<Line> lines = linesOf(text);
    QString shown = lines.first().characters.toString();
    shown.reserve(text.size() + lines.size());
    for (const Line& line : lines.sliced(1)) {
        shown += u'\n';
        shown += line.characters;
    }

    setUndoRedoEnabled(false);
    setPlainText(shown);
    joints.clear();
    QTextCursor cursor(document());
    cursor.beginEditBlock();
    QTextBlock block = document()->begin();
    for (const Line& line : lines.sliced(1)) {
        block = block.next();
        if (line.jointBefore == usualJoint)
            continue;
        QTextBlockFormat format;
        format.setProperty(jointIndex, static_cast<int>(joints.size()));
        joints.append(line.jointBefore.toString());
        cursor.setPosition(block.position());
        cursor.setBlockFormat(format);
    }
    cursor.endEditBlock();
    document()->setModified(false);
    setUndoRedoEnabled(true);
}

QString ExactTextEdit::exactText() const
{
    QString text = document()->begin().text();
    text.reserve(document()->characterCount());
    int indexBefore = -1;
    for (QTextBlock block = document()->begin().next(); block.isValid(); block = block.next()) {
        const QVariant kept = block.blockFormat().property(jointIndex);
        const int index = kept.isValid() ? kept.toInt() : -1;
        // a line that a person starts inherits the format of the line that it was cut from
        text += index < 0 || index == indexBefore ? QString(usualJoint) : joints[index];
        text += block.text();
        indexBefore = index;
    }
    return text;
}

}  // namespace kest
