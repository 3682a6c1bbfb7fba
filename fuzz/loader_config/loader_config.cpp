// Loads arbitrary bytes as a morph loader configuration file into a source list: reading and
// applying to the rows together (slow: every input builds a source list of widgets; the reading
// alone is fuzzed fast by loader_config_read). Every input must end in a load error or in listed
// sources; warnings are collected instead of shown.

#include "sgcore/app/sgapp.h"
#include "sgcore/app/sgappsettings.h"
#include "sharedsource/loaderui/sgmorphconfiguration.h"
#include "sharedsource/loaderui/sgmorphsourcelist.h"

#include <QApplication>
#include <QDir>
#include <QFile>
#include <QTemporaryDir>
#include <cstdint>
#include <cstdlib>

namespace {
struct Host {
    Host() {
        qputenv("QT_QPA_PLATFORM", "offscreen");
        static int argc = 1;
        static char name[] = "loader_config";
        static char *argv[] = {name, nullptr};
        application = new QApplication(argc, argv);
        SgAppSettings::setFileName(folder.filePath("scenara.ini"));
        host = new SgApp;
        // Geometry that configuration files can name, next to them.
        QFile geometry(folder.filePath("head.obj"));
        if (geometry.open(QIODevice::WriteOnly))
            geometry.write("v 0 0 0\nv 1 0 0\nv 0 1 0\nf 1 2 3\n");
    }
    QTemporaryDir folder;
    QApplication *application = nullptr;
    SgApp *host = nullptr;
};
} // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t *data, std::size_t size) {
    static Host host;
    // Named like an object file of the listed geometry, so both kinds of file are read.
    const QString path = host.folder.filePath("head.obj.scx");
    QFile file(path);
    if (!file.open(QIODevice::WriteOnly | QIODevice::Truncate))
        return 0;
    file.write(reinterpret_cast<const char *>(data), qint64(size));
    file.close();
    SgMorphSourceList list(nullptr, QStringLiteral("fuzz"));
    SgMorphConfiguration configuration(&list, nullptr);
    int warnings = 0;
    configuration.setMessageHandler([&warnings](const QString &, const QString &) { ++warnings; });
    const bool loaded = configuration.loadConfigurationFile(path, host.folder.path());
    // A failed load always says why.
    if (!loaded && warnings == 0)
        std::abort();
    // Whatever was listed can be written again.
    configuration.saveProjectConfiguration(host.folder.filePath("out.scx"));
    return 0;
}
