#include "sublets/PdfViewer.h"

#include "base/modLoggerEx.h"
#include "platform/Prompt.h"
#include "platform/RuntimeError.h"

#include <dlfcn.h>

#include <array>
#include <climits>
#include <filesystem>
#include <system_error>

using namespace Qt::StringLiterals;

namespace kest {

namespace {

using Viewer = void (*)(const QString& fileName);

/// Returns the folder of the library with this code, whatever the current folder is now, and also if the host has
/// loaded it through a link.
std::filesystem::path ownFolder()
{
    Dl_info info{};
    void* library = nullptr;
    std::array<char, PATH_MAX> folder{};
    std::filesystem::path file;
    std::error_code failure;
    if (::dladdr1(reinterpret_cast<const void*>(&ownFolder), &info, &library, RTLD_DL_LINKMAP) != 0 &&
        ::dlinfo(library, RTLD_DI_ORIGIN, folder.data()) == 0)
        file = std::filesystem::canonical(
            std::filesystem::path(folder.data()) / std::filesystem::path(info.dli_fname).filename(), failure);
    if (file.empty())
        throw RuntimeError(FileNotFound, u"The folder of the component is not known."_s);
    return file.parent_path();
}

/// Returns the function that shows a document. Loads its library if this is the first one.
Viewer viewer()
{
    const std::filesystem::path path = ownFolder() / "kest2" / "libkest2pdf-" KEST_VERSION ".so";
    void* const library = ::dlopen(path.c_str(), RTLD_NOW);
    void* const show = library ? ::dlsym(library, "kest2ShowPdf") : nullptr;
    if (!show)
        throw RuntimeError(FileNotFound, QString::fromLocal8Bit(::dlerror()));
    return reinterpret_cast<Viewer>(show);
}

}  // namespace

void showPdf(const QString& fileName)
{
    Viewer show = nullptr;
    try {
        show = viewer();
    } catch (const RuntimeError& error) {
        attempt([&] { logFailure(error, u"showPdf"_s); });
        desktop::msgBox(
            u"The document %1 can't be shown: the PDF viewer of KEST2 is missing or damaged."_s.arg(fileName),
            desktop::Icon::Critical);
        return;
    }
    show(fileName);
}

}  // namespace kest
