#include "krhost.h"

#include "krapp.h"
#include "krstyle.h"

#include <QApplication>
#include <QCommandLineParser>
#include <QFileInfo>

int main(int argc, char* argv[])
{
    QApplication app(argc, argv);
    QApplication::setApplicationName(QStringLiteral("krhost"));
    QApplication::setOrganizationName(QStringLiteral("krcorvane"));
    QApplication::setApplicationVersion(QStringLiteral("1.0.0"));

    QCommandLineParser parser;
    parser.setApplicationDescription(
        QStringLiteral("Host for shader-network editing plug-ins.\n"
                       "Scripts see every class the plug-ins contribute, the main window as "
                       "'mainWindow' and the application as 'krApp'; print(...) writes a line "
                       "and exit(code) ends the program."));
    parser.addHelpOption();
    parser.addVersionOption();
    const QCommandLineOption scriptOption(QStringLiteral("script"),
                                          QStringLiteral("Runs FILE after start-up."),
                                          QStringLiteral("FILE"));
    const QCommandLineOption screenshotOption(
        QStringLiteral("screenshot"),
        QStringLiteral("Writes the main window as a PNG to FILE after start-up, then exits."),
        QStringLiteral("FILE"));
    const QCommandLineOption pluginsOption(
        QStringLiteral("plugins"),
        QStringLiteral("Loads plug-ins from DIR instead of the default folder."),
        QStringLiteral("DIR"));
    parser.addOption(scriptOption);
    parser.addOption(screenshotOption);
    parser.addOption(pluginsOption);
    parser.process(app);

    KrHost::Options options;
    options.scriptFile = parser.value(scriptOption);
    options.screenshotFile = parser.value(screenshotOption);
    options.pluginFolder = parser.value(pluginsOption);
    if (!options.pluginFolder.isEmpty() && !QFileInfo(options.pluginFolder).isDir()) {
        fprintf(stderr, "krhost: the plug-in folder %s does not exist\n",
                qPrintable(options.pluginFolder));
        return 1;
    }

    QApplication::setStyle(krApp->getStyle());

    KrHost host(options);
    host.start();
    return app.exec();
}
