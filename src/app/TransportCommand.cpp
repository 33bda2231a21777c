#include "app/TransportCommand.h"

#include "loopback/TransportWindow.h"
#include "platform/Prompt.h"
#include "platform/RuntimeError.h"
#include "platform/files/files.h"
#include "platform/profile.h"

#include <QEventLoop>
#include <QFile>

namespace kest::app {

using namespace Qt::StringLiterals;

namespace {

bool showWindow()
{
    TransportWindow window(transportFolders());
    if (!window.claim()) {
        if (TransportWindow::raiseOther(transportFolders()))
            return true;
        desktop::msgBox(u"KESTWeb is running already."_s, desktop::Icon::Information, u"KESTWeb"_s);
        return false;
    }
    window.run();
    return true;
}

}  // namespace

bool runTransport(TransportMode mode, const TransportRunner::Heard& heard)
{
    if (mode == TransportMode::Window)
        return showWindow();

    TransportRunner runner(transportFolders(), heard);
    if (!runner.claim())
        return false;
    if (mode == TransportMode::Once) {
        runner.carryNow();
        return true;
    }
    QEventLoop loop;
    const OnTermination termination([&] { loop.quit(); });
    runner.start();
    loop.exec();
    return true;
}

void installTransport(const QString& command)
{
    const QString program = profile::componentFolder() + u"/KESTWeb.exe"_s;
    const QByteArray quoted = '\'' + QFile::encodeName(command).replace('\'', "'\\''") + '\'';
    files::writeBytes(program,
                      "#!/bin/sh\n"
                      "# Starts the loopback transport of this demo in its window. Made by: kest2 init --demo\n"
                      "exec " +
                          quoted + " --profile \"${KEST2_PROFILE:-$(dirname -- \"$0\")/..}\" transport --window\n");
    if (!QFile::setPermissions(program, QFile::permissions(program) | QFile::ExeOwner | QFile::ExeUser |
                                            QFile::ExeGroup | QFile::ExeOther))
        throw RuntimeError(PermissionDenied, u"%1 can't be made executable."_s.arg(program));
}

}  // namespace kest::app
