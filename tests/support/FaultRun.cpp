#include "support/FaultRun.h"

#include "app/QuoteDatabase.h"
#include "inbound/modLoadXML.h"
#include "messages/Folders.h"
#include "platform/database/FaultInjection.h"
#include "platform/files/FaultInjection.h"
#include "platform/files/files.h"
#include "platform/profile.h"
#include "platform/values.h"
#include "shell/SharedVariables.h"

#include <QDir>
#include <QDirIterator>
#include <QFile>
#include <QMap>

namespace kest::test {

using namespace Qt::StringLiterals;

namespace {

constexpr const char* tables[] = {"QUOTE1", "QUOTE2",          "QUOTE3", "CAR",   "CUSTOMER", "INSURER",     "CINFO",
                                  "VENDOR", "ALLMODEL",        "MODEL",  "BODY2", "JOBSTAGE", "KESTColours", "SUBLET",
                                  "DEBTOR", "ReportDefinition"};

QString driveC()
{
    return profile::root() + u"/drive_c"_s;
}

QMap<QString, QByteArray> filesOnDisk()
{
    QMap<QString, QByteArray> found;
    QDirIterator walk(driveC(), QDir::Files | QDir::Hidden, QDirIterator::Subdirectories);
    while (walk.hasNext()) {
        QFile file(walk.next());
        if (file.open(QIODevice::ReadOnly))
            found.insert(file.fileName(), file.readAll());
    }
    return found;
}

std::string holdings()
{
    QStringList lines;
    for (const char* table : tables) {
        const QString name = QString::fromLatin1(table);
        QStringList ofTable;
        for (db::Recordset rows = Opened(u"SELECT * FROM "_s + name); !rows.eof(); rows.moveNext()) {
            QStringList values{name};
            for (const QString& column : rows.columns())
                values += column + u'=' + (rows.isNull(column) ? u"Null"_s : rows.text(column));
            ofTable += values.join(u' ');
        }
        ofTable.sort();
        lines += ofTable;
    }
    const QMap<QString, QByteArray> files = filesOnDisk();
    for (auto file = files.begin(); file != files.end(); ++file)
        lines += file.key().sliced(driveC().size()) + u": "_s + QString::fromLatin1(file.value());
    return lines.join(u'\n').toStdString();
}

/// The shop's files and database, to go back to.
class Snapshot {
public:
    Snapshot() : files_(filesOnDisk())
    {
        gConn->close();
        database_ = files::readBytes(app::embeddedFile(u"WirSql"_s));
        gConn = app::openEmbedded(u"WirSql"_s);
    }

    void restore() const
    {
        gConn->close();
        const QString place = app::embeddedFile(u"WirSql"_s);
        for (const char* suffix : {"-wal", "-shm"})
            QFile::remove(place + QString::fromLatin1(suffix));
        files::writeBytes(place, database_);
        gConn = app::openEmbedded(u"WirSql"_s);

        const QMap<QString, QByteArray> now = filesOnDisk();
        for (auto file = now.begin(); file != now.end(); ++file) {
            if (!files_.contains(file.key()))
                QFile::remove(file.key());
        }
        for (auto file = files_.begin(); file != files_.end(); ++file) {
            if (now.value(file.key()) == file.value() && now.contains(file.key()))
                continue;
            QFile::remove(file.key());
            files::writeBytes(file.key(), file.value());
        }
        gsMatchedQTNNO.clear();
        gsDeletedQTNNO.clear();
        gsDeletedSubquote.clear();
    }

private:
    QMap<QString, QByteArray> files_;
    QByteArray database_;
};

/// The lines that only one of two shops holds.
std::string difference(const std::string& expected, const std::string& found)
{
    const QStringList before = QString::fromStdString(expected).split(u'\n');
    const QStringList after = QString::fromStdString(found).split(u'\n');
    QStringList lines;
    for (const QString& line : before) {
        if (!after.contains(line))
            lines += u"- "_s + line;
    }
    for (const QString& line : after) {
        if (!before.contains(line))
            lines += u"+ "_s + line;
    }
    return '\n' + lines.join(u'\n').toStdString();
}

void setFault(FaultOf of, std::function<bool()> fault)
{
    if (of == FaultOf::Statement)
        db::setStatementFault(std::move(fault));
    else
        files::setFault(std::move(fault));
}

}  // namespace

bool loadAsTheWindow(const QString& message)
{
    bool taken = false;
    attempt([&] {
        QString text = files::read(gsUnreadPath + message);
        taken = LoadXML(text, message);
    });
    if (taken)
        MoveMessage(message, u"read"_s);
    return taken;
}

std::string describe(const DisturbedLoad& load)
{
    return (load.of == FaultOf::Statement ? "statement " : "file operation ") + std::to_string(load.number) +
           (load.lasting ? " and all behind it" : "") + "\nfirst load: " + (load.taken ? "taken " : "not taken ") +
           load.boxes + "\nsecond load: " + (load.takenAgain ? "taken " : "not taken ") + load.boxesAgain;
}

FaultRun::FaultRun(const QString& message, const char* script, const std::function<bool(const QString& message)>& load)
{
    const Snapshot before;
    const auto loadOnce = [&](std::string& boxes) {
        const ScriptedDesktop desktop(script);
        const bool taken = !files::exists(gsUnreadPath + message) || load(message);
        boxes = desktop.boxTexts().join(u'\n').toStdString();
        return taken;
    };

    std::string boxes;
    EXPECT_TRUE(loadOnce(boxes)) << boxes;
    undisturbed_ = holdings();

    for (const FaultOf of : {FaultOf::Statement, FaultOf::FileOperation}) {
        for (const bool lasting : {false, true}) {
            for (int number = 1;; ++number) {
                before.restore();
                DisturbedLoad disturbed{of, number, lasting, false, {}, false, {}, {}};
                int step = 0;
                setFault(of, [&] {
                    ++step;
                    return lasting ? step >= number : step == number;
                });
                disturbed.taken = loadOnce(disturbed.boxes);
                setFault(of, {});
                if (step < number)
                    break;
                disturbed.takenAgain = loadOnce(disturbed.boxesAgain);
                disturbed.shop = holdings();
                loads_.push_back(disturbed);
            }
        }
    }
    before.restore();
}

void FaultRun::expectAsIfNeverDisturbed(const std::vector<KnownDifference>& known) const
{
    std::vector<int> seen(known.size());
    for (const DisturbedLoad& load : loads_) {
        if (load.takenAgain && load.shop == undisturbed_)
            continue;
        bool explained = false;
        for (size_t i = 0; i < known.size() && !explained; ++i) {
            explained = known[i].holds(load);
            seen[i] += explained;
        }
        EXPECT_TRUE(explained) << describe(load) << difference(undisturbed_, load.shop);
    }
    for (size_t i = 0; i < known.size(); ++i)
        EXPECT_GT(seen[i], 0) << "never comes up: " << known[i].why;
}

}  // namespace kest::test
