#include "quotedata/NoteChain.h"

#include "base/Helpers.h"
#include "platform/values.h"

#include <QStringList>

namespace kest {

using namespace Qt::StringLiterals;

namespace {

// Where the status or the subject of "(21/03/2008 : ..." begins, counted from 0; a date has ten characters.
constexpr int bodyOfNote = 13;

QString body(const QString& subject, const QString& status, const QString& detail)
{
    QString text = u" "_s;
    if (!status.isEmpty())
        text += status + u' ';
    text += subject;
    if (!detail.isEmpty())
        text += u" - "_s + detail;
    return text + u')';
}

bool mentions(const QString& remarks, const QString& subject)
{
    return remarks.contains(subject, Qt::CaseInsensitive);
}

/// Splits a chain into its notes. A note ends at its first ")". The character after that separates it from the next
/// note and is dropped, even if it is not a blank.
QStringList split(const QString& remarks)
{
    QStringList notes;
    for (qsizetype from = 0; from < remarks.size();) {
        const qsizetype end = remarks.indexOf(u')', from);
        if (end < 0) {
            notes += remarks.sliced(from);
            break;
        }
        notes += remarks.sliced(from, end + 1 - from);
        from = end + 2;
    }
    return notes;
}

}  // namespace

QString AddNewNote(const QString& subject, const QString& status, QString& remarks, const QString& detail)
{
    const QString note = u'(' + shortDate(QDate::currentDate()) + u" :"_s + body(subject, status, detail);
    remarks = trimBlanks(note + u' ' + remarks);
    return remarks;
}

QString AddNote(const QString& subject, const QString& status, QString& remarks, const QString& detail, bool alwaysNew)
{
    if (alwaysNew || !mentions(remarks, subject))
        return AddNewNote(subject, status, remarks, detail);
    QStringList notes = split(remarks);
    for (QString& note : notes) {
        if (note.indexOf(subject, bodyOfNote) >= 0)
            note = note.left(note.indexOf(u':') + 1) + body(subject, status, detail);
    }
    remarks = trimBlanks(notes.join(u' '));
    return remarks;
}

QString GetNoteStatus(const QString& subject, const QString& remarks)
{
    const qsizetype at = remarks.indexOf(subject);
    if (at <= 0)
        return {};
    // The status is between ": " and the blank before the subject. A subject directly after ": " has no status.
    const qsizetype colon = remarks.lastIndexOf(u':', at - 1);
    const qsizetype length = at - colon - 3;
    return length > 0 ? remarks.sliced(colon + 2, length) : QString();
}

QString RemoveNote(const QString& subject, const QString& remarks)
{
    if (!mentions(remarks, subject))
        return remarks;
    QStringList kept;
    for (const QString& note : split(remarks)) {
        // The subject counts only in this part of the note: from eleven characters before the colon to just after the
        // first ")" that follows the status. Positions are counted from 1.
        const qsizetype from = note.indexOf(u':') + 1 - 12;
        const qsizetype length = note.indexOf(u')', from + 15 - 1) + 1 + 2;
        if (!note.mid(qMax(from, 1) - 1, length).contains(subject))
            kept += note;
    }
    return trimBlanks(kept.join(u' '));
}

}  // namespace kest
