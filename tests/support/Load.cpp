#include "support/Load.h"

#include "inbound/modLoadXML.h"
#include "messages/Folders.h"
#include "platform/RuntimeError.h"
#include "platform/files/files.h"
#include "shell/SharedVariables.h"

namespace kest::test {

bool load(const Text& message, const Text& fileName)
{
    files::write(gsUnreadPath + fileName, message);
    gsListFolder = gsUnreadPath;  // as after a fill: a load prints from there
    QString text = message;
    return LoadXML(text, fileName);
}

bool loadAsTheWindow(const QString& fileName)
{
    gsListFolder = gsUnreadPath;
    bool taken = false;
    attempt([&] {
        QString text = files::read(gsUnreadPath + fileName);
        taken = LoadXML(text, fileName);
    });
    if (taken)
        MoveMessage(fileName, QStringLiteral("read"));
    return taken;
}

}  // namespace kest::test
