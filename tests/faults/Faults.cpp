#include "Faults.h"

#include "base/Journal.h"
#include "base/modLoggerEx.h"
#include "messagelist/frmMessageList.h"
#include "platform/print/FaultInjection.h"
#include "platform/xml/FaultInjection.h"

#include <sys/wait.h>
#include <unistd.h>

namespace kest::test {

namespace {

enum class Fault { None, Once, FromThenOn, Lost, Kill };
constexpr const char* faultWords[] = {"none", "once", "on", "lost", "kill"};

/// Sees every call that can fail, as long as it lives.
class Calls {
public:
    explicit Calls(Fault fault, int number = 0)
    {
        const auto watch = [this, fault, number](const char* kind) {
            return [this, fault, number, kind] {
                const bool isIt = ++count == number;
                kinds.append(QString::fromLatin1(kind));
                if (isIt && fault == Fault::Kill)
                    ::_exit(0);
                return fault == Fault::FromThenOn ? count >= number : isIt && fault == Fault::Once;
            };
        };
        db::setStatementFault([fault, seen = watch("statement"), this,
                               number] { return seen() || (fault == Fault::Lost && count == number); },
                              fault == Fault::Lost ? CannotOpen : StatementFailed);
        db::setConnectionFault(watch("connection"));
        files::setFault(watch("file"));
        xml::setParseFault(watch("parse"));
        report::setPrintFault(watch("print"));
    }
    ~Calls()
    {
        db::setStatementFault({});
        db::setConnectionFault({});
        files::setFault({});
        xml::setParseFault({});
        report::setPrintFault({});
    }
    Q_DISABLE_COPY_MOVE(Calls)

    int count = 0;
    QStringList kinds;
};

struct Deviation {
    QStringList works, faults;
    QRegularExpression condition, lines;
    QString reason;
    int seen = 0;

    bool isOfAll() const { return works.first() == u"*"_s; }
};

std::vector<Deviation> deviationsOf(const QString& name)
{
    std::vector<Deviation> known;
    for (const auto& [works, faults, condition, lines, rule, reason] : casesIn<6>("faults/deviations.txt")) {
        const Deviation row{works.split(u' '), faults.split(u' '),
                            QRegularExpression(condition, QRegularExpression::DotMatchesEverythingOption),
                            QRegularExpression(QRegularExpression::anchoredPattern(lines)), reason};
        EXPECT_TRUE(row.condition.isValid() && row.lines.isValid() && rule.size() > 10) << reason;
        if (row.isOfAll() || row.works.contains(name))
            known.push_back(row);
    }
    return known;
}

/// Returns the shop with the rows numbered without gaps, because a number is not used again after a change that failed.
std::string numbered(const std::string& shop)
{
    static const QRegularExpression number(u"\\b(rec_id|CUST_ID|VENDOR)(_ID)?=([1-9]\\d*)\\b"_s);
    const QString found = QString::fromStdString(shop);
    QMap<QString, QMap<int, int>> places;
    for (const QRegularExpressionMatch& match : number.globalMatch(found))
        places[match.captured(1)][match.captured(3).toInt()] = 0;
    for (QMap<int, int>& ofColumn : places)
        for (int place = 0; int& given : ofColumn)
            given = ++place;
    QString result;
    qsizetype end = 0;
    for (const QRegularExpressionMatch& match : number.globalMatch(found)) {
        result += found.sliced(end, match.capturedStart(3) - end);
        result += QString::number(places[match.captured(1)][match.captured(3).toInt()]);
        end = match.capturedEnd();
    }
    return (result + found.sliced(end)).toStdString();
}

/// Returns the boxes, and what stands below the list but for the count of messages, which tells nothing.
QSet<QString> sentencesIn(QString shown)
{
    static const QRegularExpression count(u"(No unread|\\d+) messages?(?=\n|$)"_s);
    const QStringList sentences = shown.remove(count).split(u'\n', Qt::SkipEmptyParts);
    return {sentences.begin(), sentences.end()};
}

/// Writes a changed row as its first value and the columns that differ, and a moved file as its two places.
QStringList shortened(QStringList lines)
{
    const auto fieldsOf = [](const QString& line) {  // the first one does not differ
        static const QRegularExpression columns(u" (?=\\w+=)"_s);
        return line.mid(2, 1) == u"/"_s ? QStringList{line.section(u": "_s, 1), line.mid(2).section(u": "_s, 0, 0)}
                                        : line.mid(2).split(columns);
    };
    for (qsizetype gone = 0; gone < lines.size(); ++gone) {
        for (qsizetype come = gone + 1; lines[gone].startsWith(u'-') && come < lines.size(); ++come) {
            const QStringList before = fieldsOf(lines[gone]), after = fieldsOf(lines[come]);
            if (!lines[come].startsWith(u'+') || after.size() != before.size() || after[0] != before[0])
                continue;
            const bool isFile = before.size() == 2;
            lines[gone] = u"~ "_s + (isFile ? before[1] : before[0] + u' ' + before[1]) + u':';
            for (qsizetype field = 1; field < before.size(); ++field)
                if (after[field] != before[field])
                    lines[gone] += u' ' + (isFile ? u"is "_s + after[1] : before[field].section(u'=', 0, 0));
            lines.removeAt(come);
        }
    }
    return lines;
}

/// Removes what a killed writer has left. The next start after a day would do it.
void removeTemporaryFiles()
{
    QDirIterator walk(profile::root() + u"/drive_c"_s, {u".kest-*.tmp"_s}, QDir::Files | QDir::Hidden,
                      QDirIterator::Subdirectories);
    while (walk.hasNext())
        QFile::remove(walk.next());
}

/// Waits until the server has noticed that the killed process is gone.
void waitForLocks()
{
    EXPECT_TRUE(db::Lock(gConn, u"load M.XML"_s, 10).isHeld());
    if (!journal::isKept())
        return;
    for (const QSqlRecord& row : plainRows(u"SELECT LockName FROM KESTOperation WHERE State='open'"_s))
        EXPECT_TRUE(db::Lock(gConn, row.value(0).toString(), 10).isHeld());
}

QString statusShown;

/// Operates windows without showing them: a killed process shares no threads with this one, and Qt paints with threads.
struct HiddenWindows final : desktop::WindowDriver {
    bool drive(QDialog& window) override
    {
        if (const auto steps = work.windows.find(window.objectName()); steps != work.windows.end())
            steps->second(window);
        return true;
    }
    explicit HiddenWindows(const Work& ofWork) : work(ofWork) {}
    const Work& work;
};

/// One work of a shop, its end without a fault, and what is known to end differently.
class Trial {
public:
    Trial(const QString& name, const Work& work, std::optional<ScriptedDesktop>& desktop);
    /// Does the work with a fault at one of its calls, goes on as a user would, and compares. Returns false if a
    /// process that was to be killed came to its end.
    bool disturb(Fault fault, int number);
    void tellWhatCameUp(bool isWhole) const;

    const QStringList& kinds() const { return kinds_; }

private:
    /// Returns what the user sees.
    QString run(Fault fault = Fault::None, int number = 0);
    bool killAt(int number);
    void takeSeat();
    std::string shop() const { return numbered(work.result ? work.result() : holdings()); }
    /// Returns the differences that no known deviation explains.
    QStringList unexplained(Fault fault, const QString& account, QStringList differences);

    QString name;
    const Work& work;
    std::optional<ScriptedDesktop>& desktop;
    std::vector<Deviation> known;
    const Snapshot before;
    QString undisturbed;
    std::string expected;
    QStringList kinds_;
    int faults = 0, different = 0;
};

Trial::Trial(const QString& ofName, const Work& ofWork, std::optional<ScriptedDesktop>& ofShop)
    : name(ofName), work(ofWork), desktop(ofShop), known(deviationsOf(name))
{
    for (int time = 1; time <= 2; ++time) {  // the first one makes some calls that later ones don't need
        kinds_.clear();
        before.restore();
        work.prepare();
        undisturbed = run();
    }
    EXPECT_TRUE(work.isDone()) << undisturbed;
    expected = shop();
}

/// Sits a user down before the shop.
void Trial::takeSeat()
{
    desktop.emplace(work.answers);
    desktop::setWindowDriver(std::make_shared<HiddenWindows>(work));
    statusShown.clear();
}

QString Trial::run(Fault fault, int number)
{
    takeSeat();
    {
        Calls counted(fault, number);
        desktop::guarded(u"work"_s, work.doIt);
        if (kinds_.isEmpty())
            kinds_ = counted.kinds;
    }
    if (fault == Fault::None && work.meanwhile)
        work.meanwhile();
    return desktop->boxTexts().join(u'\n') + u'\n' + statusShown;
}

/// Ends another process of the same workstation at that call. Returns false if it has fewer calls.
bool Trial::killAt(int number)
{
    closeConnections();
    const pid_t child = ::fork();
    if (child == 0) {
        takeSeat();
        const Calls counted(Fault::Kill, number);
        EnsureConnection();  // which settles what it finds
        desktop::guarded(u"work"_s, work.doIt);
        ::_exit(1);
    }
    if (work.meanwhile) {
        EnsureConnection();
        work.meanwhile();
    }
    int status = 0;
    ::waitpid(child, &status, 0);
    EXPECT_TRUE(WIFEXITED(status)) << name << ": the process crashed before call " << number;
    EnsureConnection();
    waitForLocks();
    removeTemporaryFiles();
    return WEXITSTATUS(status) == 0;
}

QStringList Trial::unexplained(Fault fault, const QString& account, QStringList differences)
{
    for (Deviation& deviation : known) {
        if (!deviation.faults.contains(QString::fromLatin1(faultWords[int(fault)])) ||
            !account.contains(deviation.condition))
            continue;
        const auto explained = differences.removeIf(
            [&](const QString& difference) { return deviation.lines.match(difference).hasMatch(); });
        deviation.seen += explained > 0;
    }
    return differences;
}

bool Trial::disturb(Fault fault, int number)
{
    ++faults;
    bool isReached = true;
    before.restore();
    work.prepare();
    const qint64 logBefore = QFileInfo(errorLogPath()).size();
    QString first = u"killed"_s;
    if (fault == Fault::Kill)
        isReached = killAt(number);
    else
        first = run(fault, number);
    const bool isTold = fault == Fault::Kill || !(sentencesIn(first) - sentencesIn(undisturbed)).isEmpty() ||
                        QFileInfo(errorLogPath()).size() > logBefore;
    const bool isDone = work.isDone();
    attempt([] { Faults::openList(); });  // this takes interrupted work back, or finishes it
    const QString second = work.isDone() ? QString() : run();
    const std::string found = shop();
    EXPECT_EQ(rowCount("KESTOperation", "State IN ('open', 'interrupted')"), 0)
        << name << ' ' << faultWords[int(fault)] << ' ' << number << '\n'
        << files::read(errorLogPath());
    QStringList differences = QString::fromStdString(difference(expected, found)).split(u'\n', Qt::SkipEmptyParts);
    if (found != expected && differences.isEmpty())
        differences.append(u"other rows or another order"_s);
    if (!isDone && !isTold)
        differences.append(u"in silence"_s);
    if (!second.isEmpty() && second != undisturbed)
        differences.append(u"second: "_s + QString(second).replace(u'\n', u' '));
    const QString account =
        u"%1: %2 %3 of %4 (%5)\nfirst: %6: %7\n"_s.arg(name, QString::fromLatin1(faultWords[int(fault)]))
            .arg(number)
            .arg(kinds_.size())
            .arg(kinds_.value(number - 1), isDone ? u"done"_s : u"not done"_s, first) +
        differences.join(u'\n');
    if (!differences.isEmpty()) {
        ++different;
        EXPECT_EQ(unexplained(fault, account, shortened(differences)), QStringList()) << account;
    }
    return isReached;
}

void Trial::tellWhatCameUp(bool isWhole) const
{
    before.restore();
    std::cout << name.toStdString() << ": " << kinds_.size() << " calls, " << faults << " faults, " << different
              << " different\n";
    for (const Deviation& deviation : known) {
        if (deviation.seen > 0)
            std::cout << "  " << deviation.seen << " x " << deviation.reason.toStdString() << '\n';
        EXPECT_TRUE(!isWhole || deviation.isOfAll() || deviation.seen > 0)
            << name << ": never comes up: " << deviation.reason;
    }
}

}  // namespace

QStringList Faults::openList()
{
    QStringList rows;
    frmMessageList window;
    window.openUnread();
    for (const ListedMessage& message : window.rows())
        rows << message.file + u'|' + QStringList(message.row.begin(), message.row.end()).join(u'|');
    statusShown = control<QLabel>(window, "lblStatus").text();
    return rows;
}

void Faults::loadFirst()
{
    frmMessageList window;
    window.openUnread();
    control<QPushButton>(window, "cmdProcess").click();
    statusShown = control<QLabel>(window, "lblStatus").text();
}

void Faults::survives(const QString& name, const Work& work)
{
    const bool isWhole = qEnvironmentVariable("KEST2_TEST_FAULTS") == u"all"_s && !shopIsOnServer();
    Trial trial(name, work, desktop);
    QList<Fault> faults{Fault::Once, Fault::FromThenOn, Fault::Lost, Fault::Kill};
    faults.remove(0, work.meanwhile ? 3 : shopIsOnServer() ? 2 : 0);
    for (const Fault fault : faults) {
        const int stride = isWhole || (fault == Fault::Lost && !shopIsOnServer()) ? 1 : 10;
        for (int number = 1; fault == Fault::Kill || number <= trial.kinds().size(); number += stride)
            if (fault != Fault::Lost || trial.kinds()[number - 1] == u"statement"_s)
                if (!trial.disturb(fault, number))
                    break;
    }
    trial.tellWhatCameUp(isWhole);
}

}  // namespace kest::test
