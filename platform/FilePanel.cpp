#include "platform/FilePanel.h"

#include <QDir>
#include <QFileDialog>
#include <QStandardPaths>

#include "platform/private/Loop.h"

namespace {

QString gFolder; // chosen last

QString FirstFolder() {
    const QString pictures = QStandardPaths::writableLocation(QStandardPaths::PicturesLocation);
    return QDir(pictures).exists() ? pictures : QDir::homePath();
}

} // namespace

std::string RunSavePanel(const char* title, const std::string& proposed, const std::vector<FileKind>& kinds) {
    QFileDialog dialog(nullptr, QString::fromUtf8(title), gFolder.isEmpty() ? FirstFolder() : gFolder);
    dialog.setObjectName(QStringLiteral("save dialog"));
    dialog.setAcceptMode(QFileDialog::AcceptSave);
    QStringList filters;
    for (const FileKind& kind : kinds)
        filters
            << QStringLiteral("%1 (*%2)").arg(QString::fromUtf8(kind.label), QLatin1String(kind.extension));
    dialog.setNameFilters(filters);
    const auto choose = [&](const QString& filter) {
        if (const qsizetype kind = filters.indexOf(filter); kind >= 0)
            dialog.setDefaultSuffix(QLatin1String(kinds[static_cast<std::size_t>(kind)].extension));
    };
    QObject::connect(&dialog, &QFileDialog::filterSelected, &dialog, choose);
    choose(filters.front());
    dialog.selectFile(QString::fromStdString(proposed).replace('/', '-') +
                      QLatin1String(kinds.front().extension));
    if (RunDialog(dialog) != QDialog::Accepted)
        return {};
    gFolder = dialog.directory().absolutePath();
    return QFile::encodeName(dialog.selectedFiles().value(0)).toStdString();
}
