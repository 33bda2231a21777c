// A host program that loads the component with dlopen and uses only its binary interfaces.
// kest_host LIBRARY create           creates and releases an object in a process without a Qt application
// kest_host LIBRARY refused [core]   expects a refusal, with a core application if "core" is given
// kest_host LIBRARY show QTNNO SUB   shows the panel, prints what it sees, and closes the panel like a person
#include "shell/component.h"

#include <QApplication>
#include <QRadioButton>
#include <QTimer>

#include <dlfcn.h>

#include <cstdio>
#include <cstdlib>
#include <memory>

using namespace kest;

namespace {

void check(bool holds, const char* what)
{
    if (holds)
        return;
    std::fprintf(stderr, "failed: %s\n", what);
    std::exit(11);
}

template <class Function>
Function* entry(void* library, const char* name)
{
    void* found = dlsym(library, name);
    check(found != nullptr, name);
    return reinterpret_cast<Function*>(found);
}

void closePanel()
{
    QWidget* window = QApplication::activeModalWidget();
    if (!window)
        return;
    std::printf("%s\n", qPrintable(window->windowTitle()));
    for (const QRadioButton* option : window->findChildren<QRadioButton*>())
        std::printf("%s%s%s\n", qPrintable(option->objectName()), option->isChecked() ? " chosen" : "",
                    option->isEnabled() ? "" : " disabled");
    window->close();
}

}  // namespace

int main(int argc, char** argv)
{
    check(argc > 2, "arguments");
    const QString mode = QString::fromLocal8Bit(argv[2]);
    std::unique_ptr<QApplication> application;
    std::unique_ptr<QCoreApplication> core;
    if (argc > 3 && qstrcmp(argv[3], "core") == 0)
        core = std::make_unique<QCoreApplication>(argc, argv);
    if (mode == QLatin1String("show"))
        application = std::make_unique<QApplication>(argc, argv);

    void* library = dlopen(argv[1], RTLD_NOW | RTLD_LOCAL);
    check(library != nullptr, "dlopen");
    auto* getClassObject =
        entry<com::HResult(const com::Guid&, const com::Guid&, void**)>(library, "DllGetClassObject");
    auto* canUnloadNow = entry<com::HResult()>(library, "DllCanUnloadNow");

    void* object = nullptr;
    const com::Guid unknown{1, 2, 3, {4}};
    check(canUnloadNow() == com::Ok, "unload before use");
    check(getClassObject(unknown, com::IID_IClassFactory, &object) == com::ClassNotAvailable, "unknown class");
    check(getClassObject(CLSID_eKEST, unknown, &object) == com::NoInterface && !object, "unknown interface");
    check(getClassObject(CLSID_eKEST, com::IID_IClassFactory, &object) == com::Ok, "class object");
    auto* factory = static_cast<com::IClassFactory*>(object);
    check(factory->CreateInstance(factory, IID_IeKEST, &object) == com::NoAggregation, "aggregation");
    if (mode == QLatin1String("refused")) {
        check(factory->CreateInstance(nullptr, IID_IeKEST, &object) == com::Fail && !object, "refuse");
        factory->Release();
        std::puts("refused");
        return 0;
    }
    check(factory->CreateInstance(nullptr, IID_IeKEST, &object) == com::Ok, "create");
    auto* component = static_cast<IeKEST*>(object);
    factory->Release();
    check(canUnloadNow() == com::False, "unload while an object lives");

    if (application) {
        QTimer timer;
        QObject::connect(&timer, &QTimer::timeout, closePanel);
        timer.start(20);
        std::u16string quote = QString::fromLocal8Bit(argv[3]).toStdU16String();
        std::u16string subquote = QString::fromLocal8Bit(argv[4]).toStdU16String();
        Text quoteText = quote.data();
        Text subquoteText = subquote.data();
        check(component->ShowKESTWindow(&quoteText, &subquoteText) == com::Ok, "show");
    }
    check(component->Release() == 0, "release");
    check(canUnloadNow() == com::Ok, "unload after use");
    std::puts("done");
    return 0;
}
