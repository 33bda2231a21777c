// The command kest2, which does from a terminal what the windows do.
#include "app/CommandLine.h"
#include "app/Commands.h"
#include "platform/desktop/Display.h"
#include "platform/desktop/ScratchSettings.h"

#include <QApplication>

#include <cstdio>
#include <optional>

namespace {

QStringList words(int argc, char** argv)
{
    QStringList list;
    for (int i = 1; i < argc; ++i)
        list.append(QString::fromLocal8Bit(argv[i]));
    return list;
}

QtMessageHandler usualHandler = nullptr;

/// Drops remarks that Qt makes for windows without a display and in a service or a scheduled job, so that standard
/// error has only what the user needs.
void withoutRemarks(QtMsgType type, const QMessageLogContext& context, const QString& message)
{
    const auto isRemark = [&](const char* part) { return message.contains(QLatin1String(part)); };
    if (!isRemark("This plugin does not support") && !isRemark("XDG_RUNTIME_DIR not set"))
        usualHandler(type, context, message);
}

}  // namespace

int main(int argc, char** argv)
{
    using namespace kest::app;
    CommandLine line = parsed(words(argc, argv));
    if (line.command == QLatin1String("--help")) {
        std::fputs(qUtf8Printable(usage()), stdout);
        return Done;
    }
    if (line.command == QLatin1String("--version")) {
        std::puts("kest2 " KEST_VERSION);
        return Done;
    }
    if (!line.error.isEmpty())
        return refuse(line, line.error + QLatin1String("\n\n") + usage(), Usage);
    if (isInteractive(line) && !kest::desktop::hasDisplay() && !withoutWindow(line))
        return refuse(
            line,
            QStringLiteral("there is no display to open the panel on; give a --script, or run it in a desktop "
                           "session"),
            NeedsAPerson);
    if (!isInteractive(line) && !qEnvironmentVariableIsSet("QT_QPA_PLATFORM"))
        qputenv("QT_QPA_PLATFORM", "offscreen");
    std::optional<kest::desktop::ScratchSettings> scratch;
    if (!isInteractive(line))
        scratch.emplace();
    usualHandler = qInstallMessageHandler(withoutRemarks);

    QApplication application(argc, argv);
    application.setApplicationName(QStringLiteral("kest2"));
    application.setApplicationVersion(QStringLiteral(KEST_VERSION));
    return run(line);
}
