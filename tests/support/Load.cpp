#include "support/Load.h"

#include "inbound/modLoadXML.h"
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

}  // namespace kest::test
