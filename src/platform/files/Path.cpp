// Translates the host's paths into those of this system, finds names in any case, and lists folders.
#include "platform/RuntimeError.h"
#include "platform/files/SystemFile.h"
#include "platform/files/files.h"
#include "platform/profile.h"
#include "platform/wildcards.h"

#include <dirent.h>
#include <strings.h>
#include <sys/stat.h>

#include <algorithm>
#include <memory>
#include <vector>

using namespace Qt::StringLiterals;

namespace kest::files {

namespace {

using Folder = std::unique_ptr<DIR, int (*)(DIR*)>;

Folder openFolder(const QString& systemPath)
{
    return {::opendir(encodedPath(systemPath).constData()), &::closedir};
}

bool isAscii(const QString& text)
{
    return std::all_of(text.begin(), text.end(), [](QChar c) { return c < QChar(0x80); });
}

bool isDriveLetter(QChar c)
{
    return (c >= u'a' && c <= u'z') || (c >= u'A' && c <= u'Z');
}

/// A path, split into the folder in which the search begins and the names to find.
struct Route {
    QString start;
    QStringList names;
};

/// Splits a path into names. ".." never leads out of a drive.
QStringList namesOf(const QString& path)
{
    QStringList names;
    for (const QString& name : path.split(u'/', Qt::SkipEmptyParts)) {
        if (name == ".."_L1) {
            if (!names.isEmpty())
                names.removeLast();
        } else if (name != "."_L1) {
            names.append(name);
        }
    }
    return names;
}

Route routeOf(const QString& path)
{
    QString rest = path;
    rest.replace(u'\\', u'/');
    if (rest.size() >= 2 && rest[1] == u':' && isDriveLetter(rest[0])) {
        const QString drive = u"/drive_"_s + rest[0].toLower();
        return {profile::root() + drive, namesOf(rest.sliced(2))};
    }
    if (rest.startsWith("//"_L1))
        return {profile::root() + u"/unc"_s, namesOf(rest)};
    if (path.startsWith(u'/'))
        return {QString(), namesOf(rest)};
    return {profile::root() + u"/drive_c"_s, namesOf(rest)};  // without a drive, C: is meant
}

/// Returns the name in the folder that differs only in case, or an empty text if there is none.
QString variantIn(const QString& folder, const QString& name)
{
    const Folder open = openFolder(folder.isEmpty() ? u"/"_s : folder);
    if (!open)
        return {};
    const bool plain = isAscii(name);
    const QByteArray wanted = encodedPath(name);
    QString found;
    while (const dirent* entry = ::readdir(open.get())) {
        if (plain ? ::strcasecmp(entry->d_name, wanted.constData()) != 0
                  : decodedName(entry->d_name).compare(name, Qt::CaseInsensitive) != 0)
            continue;
        const QString candidate = decodedName(entry->d_name);
        if (found.isEmpty() || candidate < found)
            found = candidate;
    }
    return found;
}

bool isThere(const QString& systemPath)
{
    struct stat state {};
    return !systemPath.contains(QChar(u'\0')) && ::lstat(encodedPath(systemPath).constData(), &state) == 0;
}

/// Returns the path with each name in its spelling on the disk, up to the first name that does not exist.
QString found(const QString& start, const QStringList& names)
{
    const auto asAsked = [&](qsizetype count) {
        return count == 0 ? start : start + u'/' + names.first(count).join(u'/');
    };
    qsizetype known = names.size();  // usually the whole path is there as asked, or all but the last name
    while (known > 0 && !isThere(asAsked(known)))
        --known;
    QString reached = asAsked(known);
    for (qsizetype i = known; i < names.size(); ++i) {
        QString next = reached + u'/' + names[i];
        if (i == known || !isThere(next)) {
            const QString variant = variantIn(reached, names[i]);
            if (variant.isEmpty())
                return reached + u'/' + names.sliced(i).join(u'/');
            next = reached + u'/' + variant;
        }
        reached = next;
    }
    return reached;
}

}  // namespace

QString systemPath(const QString& path)
{
    if (path.isEmpty())
        return {};
    const Route route = routeOf(path);
    const QString result = found(route.start, route.names);
    return result.isEmpty() ? u"/"_s : result;
}

QString spelledPath(const QString& path)
{
    Route route = routeOf(path);
    if (route.names.isEmpty())
        return route.start;
    const QString name = route.names.takeLast();
    return found(route.start, route.names) + u'/' + name;
}

QString placeOf(const QString& path, Target target)
{
    return target == Target::Free ? spelledPath(path) : systemPath(path);
}

bool isPlainName(const QString& name)
{
    if (name.isEmpty() || name == "."_L1 || name.contains(".."_L1))
        return false;
    return std::none_of(name.begin(), name.end(), [](QChar c) {
        return c == u'/' || c == u'\\' || c == u':' || c.category() == QChar::Other_Control;
    });
}

QString pathForWriting(const QString& folder, const QString& name)
{
    if (!isPlainName(name))
        throwFileError(PathNotFound, folder + name);
    const bool separated = folder.endsWith(u'\\') || folder.endsWith(u'/');
    return separated ? folder + name : folder + u'\\' + name;
}

namespace {

/// Both are in upper case.
bool matchesMask(QStringView text, QStringView mask)
{
    return matchesWildcards(
        text, mask, u'*', [](QStringView) { return 1; },
        [](QStringView element, QChar c) { return element[0] == u'?' || element[0] == c; });
}

}  // namespace

bool matches(const QString& name, const QString& pattern)
{
    return matchesMask(name.toUpper(), pattern.toUpper());
}

QStringList list(const QString& folder, const QString& pattern)
{
    const QString place = systemPath(folder);
    if (place.isEmpty() || !isFolder(place))
        return {};
    failOnRequest(place);
    const Folder open = openFolder(place);
    if (!open)
        throwSystemError(place);

    struct Found {
        QString upper;
        QString name;
    };
    const QString mask = pattern.toUpper();
    std::vector<Found> files;
    while (const dirent* entry = ::readdir(open.get())) {
        if (entry->d_type == DT_DIR)
            continue;
        const QString name = decodedName(entry->d_name);
        const QString upper = name.toUpper();
        if (isTemporaryName(name) || !matchesMask(upper, mask))
            continue;
        if (entry->d_type == DT_REG || isFile(place + u'/' + name))
            files.push_back({upper, name});
    }
    std::sort(files.begin(), files.end(),
              [](const Found& a, const Found& b) { return a.upper != b.upper ? a.upper < b.upper : a.name < b.name; });
    QStringList names;
    names.reserve(static_cast<qsizetype>(files.size()));
    for (Found& file : files)
        names.append(std::move(file.name));
    return names;
}

void removeLeftOvers(const QString& folder)
{
    constexpr qint64 day = 24LL * 60 * 60;  // seconds
    const QString place = systemPath(folder);
    const Folder open = openFolder(place);
    if (!open)
        return;
    while (const dirent* entry = ::readdir(open.get())) {
        if (entry->d_name[0] != '.')
            continue;  // most names, in a folder with all the shop's messages
        const QString name = decodedName(entry->d_name);
        if (isTemporaryName(name) && ageOf(place + u'/' + name) > day)
            attempt([&] { removeFile(place + u'/' + name); });
    }
}

}  // namespace kest::files
