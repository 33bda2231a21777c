#include "utilities/ExactTextEdit.h"

#include <QKeyEvent>
#include <QMimeData>
#include <QTextBlock>

using namespace Qt::StringLiterals;

namespace kest {

namespace {

constexpr qsizetype longestLine = 4000;  // characters; a base64 document may be one line of millions
constexpr auto usualJoint = "\r\n"_L1;
constexpr int jointIndex = QTextFormat::UserProperty;  // an index into `joints`, in the format of the line end

/// Returns true for the characters that QPlainTextEdit treats as line ends.
bool endsLine(QChar c)
{
    return c == u'\r' || c == u'\n' || c == QChar::ParagraphSeparator || c == u'\xfdd0' || c == u'\xfdd1';
}

/// A line as it is shown, and the characters between it and the line before.
struct ShownLine {
    QStringView characters;
    QStringView jointBefore;
};

QList<ShownLine> linesOf(QStringView text)
{
    QList<ShownLine> lines;
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
    const QList<ShownLine> lines = linesOf(text);
    QString shown = lines.first().characters.toString();
    shown.reserve(text.size() + lines.size());
    for (const ShownLine& line : lines.sliced(1)) {
        shown += u'\n';
        shown += line.characters;
    }

    setUndoRedoEnabled(false);
    setPlainText(shown);
    joints.clear();
    QTextCursor cursor(document());
    cursor.beginEditBlock();
    QTextBlock block = document()->begin();
    for (const ShownLine& line : lines.sliced(1)) {
        block = block.next();
        if (line.jointBefore == usualJoint)
            continue;
        QTextCharFormat format;
        format.setProperty(jointIndex, static_cast<int>(joints.size()));
        joints.append(line.jointBefore.toString());
        cursor.setPosition(block.position());
        cursor.setBlockCharFormat(format);
    }
    cursor.endEditBlock();
    document()->setModified(false);
    setUndoRedoEnabled(true);
}

QString ExactTextEdit::exactText() const
{
    return exactText(0, document()->characterCount() - 1);
}

QString ExactTextEdit::exactText(int start, int end) const
{
    QString text;
    text.reserve(end - start);
    int indexBefore = -1;
    const QTextBlock first = document()->findBlock(start);
    for (QTextBlock block = first; block.isValid() && block.position() <= end; block = block.next()) {
        if (block != first) {
            // indexes rise through the text; one that does not was inherited by a line that the user has inserted
            const QVariant index = block.charFormat().property(jointIndex);
            const bool isKept = index.isValid() && index.toInt() > indexBefore;
            text += isKept ? joints[index.toInt()] : QString(usualJoint);
            if (isKept)
                indexBefore = index.toInt();
        }
        const int from = qMax(start - block.position(), 0);
        text += QStringView(block.text()).mid(from, end - block.position() - from);
    }
    return text;
}

void ExactTextEdit::keyPressEvent(QKeyEvent* event)
{
    if (!event->matches(QKeySequence::InsertLineSeparator))
        return QPlainTextEdit::keyPressEvent(event);
    QKeyEvent plainReturn(QEvent::KeyPress, Qt::Key_Return, Qt::NoModifier, u"\r"_s);
    QPlainTextEdit::keyPressEvent(&plainReturn);
}

QMimeData* ExactTextEdit::createMimeDataFromSelection() const
{
    auto* copied = new QMimeData;
    copied->setText(exactText(textCursor().selectionStart(), textCursor().selectionEnd()));
    return copied;
}

void ExactTextEdit::insertFromMimeData(const QMimeData* source)
{
    QMimeData pasted;
    pasted.setText(source->text().replace(QChar::LineSeparator, u'\n'));
    QPlainTextEdit::insertFromMimeData(&pasted);
}

}  // namespace kest
