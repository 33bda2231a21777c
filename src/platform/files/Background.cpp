#include "platform/files/Background.h"

#include "platform/RuntimeError.h"
#include "platform/files/SystemFile.h"
#include "platform/files/files.h"
#include "platform/profile.h"

#include <QCoreApplication>
#include <QDeadlineTimer>
#include <QFileInfo>
#include <QJsonArray>
#include <QJsonDocument>
#include <QPointer>
#include <QThread>
#include <QTimer>

#include <chrono>

using namespace Qt::StringLiterals;

namespace kest::files {

namespace {

constexpr auto pause = std::chrono::milliseconds(100);

QStringList waiting;  // paths of this system

/// Returns what identifies the file itself, because a later file of the same name is another message.
QJsonArray stateOf(const QString& file)
{
    const QFileInfo info(file);
    return {file, info.size(), info.lastModified().toMSecsSinceEpoch()};
}

QString listOfRemovals()
{
    return profile::root() + u"/removals.json"_s;
}

/// Returns the files of the list that have not been replaced since.
QStringList remembered()
{
    QStringList files;
    attempt([&] {
        for (const QJsonValue entry : QJsonDocument::fromJson(readBytes(listOfRemovals())).array())
            if (const QString file = entry.toArray().at(0).toString(); isFile(file) && entry == stateOf(file))
                files.append(file);
    });
    return files;
}

void remember()
{
    QStringList files = remembered() + waiting;
    files.removeDuplicates();
    QJsonArray list;
    for (const QString& file : files)
        list.append(stateOf(file));
    attempt([&] {
        if (!list.isEmpty())
            writeBytes(listOfRemovals(), QJsonDocument(list).toJson());
        else if (exists(listOfRemovals()))
            remove(listOfRemovals());
    });
}

void tryAll()
{
    waiting.removeIf([](const QString& file) {
        attempt([&] { removeFile(file); });
        return !isFile(file);
    });
}

/// Tries again later, as long as events are processed, which is while a window is open.
void tryLater()
{
    static QPointer<QTimer> timer;
    if (waiting.isEmpty() || !QCoreApplication::instance())
        return;
    if (!timer) {
        timer = new QTimer(QCoreApplication::instance());
        timer->setSingleShot(true);
        QObject::connect(timer, &QTimer::timeout, [] {
            tryAll();
            if (waiting.isEmpty())
                remember();
            tryLater();
        });
    }
    timer->start(pause);
}

void addAll(const QStringList& files)
{
    waiting += files;
    waiting.removeDuplicates();
    tryAll();
    if (!waiting.isEmpty())
        remember();
    tryLater();
}

}  // namespace

void removeInBackground(const QString& path)
{
    const QString place = systemPath(path);
    if (isFile(place))
        addAll({place});
}

void resumeRemovals()
{
    addAll(remembered());
}

bool waitForBackground(int milliseconds)
{
    if (waiting.isEmpty() && !isFile(listOfRemovals()))
        return true;
    const QDeadlineTimer deadline(milliseconds);
    for (tryAll(); !waiting.isEmpty() && !deadline.hasExpired(); tryAll())
        QThread::msleep(pause.count());
    remember();
    return waiting.isEmpty();
}

}  // namespace kest::files
