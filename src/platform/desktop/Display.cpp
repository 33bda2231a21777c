#include "platform/desktop/Display.h"

#include <QCoreApplication>
#include <QDir>
#include <QLibrary>
#include <QPluginLoader>
#include <QStringList>

#include <algorithm>

namespace kest::desktop {

using namespace Qt::StringLiterals;

namespace {

/// Returns true if the plugin and all libraries that it needs are installed.
bool loads(const QString& platform)
{
    for (const QString& folder : QCoreApplication::libraryPaths()) {
        const QDir plugins(folder + u"/platforms"_s);
        for (const QString& file : plugins.entryList({u"libq"_s + platform + u"*.so"_s}, QDir::Files)) {
            if (QPluginLoader(plugins.filePath(file)).load())
                return true;
        }
    }
    return false;
}

/// Returns true if the server that DISPLAY names accepts a connection.
bool xServerAnswers()
{
    QLibrary xcb(u"xcb"_s, 1);
    const auto connect = reinterpret_cast<void* (*)(const char*, int*)>(xcb.resolve("xcb_connect"));
    const auto hasError = reinterpret_cast<int (*)(void*)>(xcb.resolve("xcb_connection_has_error"));
    const auto disconnect = reinterpret_cast<void (*)(void*)>(xcb.resolve("xcb_disconnect"));
    if (!connect || !hasError || !disconnect)
        return false;
    void* connection = connect(nullptr, nullptr);
    const bool answers = hasError(connection) == 0;
    disconnect(connection);
    return answers;
}

bool canStart(const QString& platform)
{
    if (platform == u"xcb"_s && !xServerAnswers())
        return false;
    return loads(platform);
}

}  // namespace

bool hasDisplay()
{
    QStringList platforms;
    for (const QString& named : qEnvironmentVariable("QT_QPA_PLATFORM").split(u';', Qt::SkipEmptyParts))
        platforms.append(named.section(u':', 0, 0));
    if (platforms.isEmpty()) {  // Qt tries these in this order
        if (qEnvironmentVariableIsSet("DISPLAY"))
            platforms.append(u"xcb"_s);
        if (qEnvironmentVariableIsSet("WAYLAND_DISPLAY"))
            platforms.append(u"wayland"_s);
    }
    return std::any_of(platforms.cbegin(), platforms.cend(), canStart);
}

}  // namespace kest::desktop
