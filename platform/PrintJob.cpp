#include "platform/PrintJob.h"

#include <algorithm>
#include <cerrno>
#include <string>

#include <QDir>
#include <QFile>
#include <QLineEdit>
#include <QLoggingCategory>
#include <QPageSetupDialog>
#include <QPainter>
#include <QPrintDialog>
#include <QPrinter>
#include <QPrinterInfo>

#include "platform/View.h"
#include "platform/private/Convert.h"
#include "platform/private/Loop.h"
#include "platform/private/OutputFile.h"
#include "platform/private/ViewWidget.h"

namespace {

constexpr double PointsPerInch = 72;
constexpr int32 MaxCopies = 999;
constexpr int32 MinResolution = 72;
constexpr int32 MaxResolution = 4800;
constexpr float MaxPagePoints = 14400; // what a PDF page may measure

std::string Text(const BMessage& settings, const char* name) {
    const char* text = "";
    settings.FindString(name, &text);
    return text;
}

float Number(const BMessage& settings, const char* name, double fallback) {
    auto value = static_cast<float>(fallback);
    settings.FindFloat(name, &value);
    return value;
}

int32 Whole(const BMessage& settings, const char* name, int32 fallback, int32 least, int32 most) {
    int32 value = fallback;
    settings.FindInt32(name, &value);
    return value < least || value > most ? fallback : value;
}

// The size with the given key, else the one with the given measures, else the present one.
QPageSize PageSizeOf(const BMessage& settings, const QPageSize& present) {
    const QString key = QString::fromStdString(Text(settings, "page size"));
    for (int id = 0; id <= QPageSize::LastPageSize; ++id)
        if (id != QPageSize::Custom && QPageSize::key(static_cast<QPageSize::PageSizeId>(id)) == key)
            return QPageSize(static_cast<QPageSize::PageSizeId>(id));
    const QSizeF size(Number(settings, "page width", 0), Number(settings, "page height", 0));
    const bool sensible = size.width() >= 1 && size.height() >= 1 && size.width() <= MaxPagePoints &&
                          size.height() <= MaxPagePoints;
    return sensible ? QPageSize(size, QPageSize::Point) : present;
}

// Margins that leave no page are not taken.
QPageLayout LayoutOf(const BMessage& settings, QPageLayout layout) {
    layout.setUnits(QPageLayout::Point);
    layout.setPageSize(PageSizeOf(settings, layout.pageSize()));
    bool landscape = layout.orientation() == QPageLayout::Landscape;
    settings.FindBool("landscape", &landscape);
    layout.setOrientation(landscape ? QPageLayout::Landscape : QPageLayout::Portrait);
    const QMarginsF now = layout.margins();
    const QMarginsF wanted(
        Number(settings, "left margin", now.left()), Number(settings, "top margin", now.top()),
        Number(settings, "right margin", now.right()), Number(settings, "bottom margin", now.bottom()));
    const QSizeF page = layout.fullRect().size();
    if (wanted.left() + wanted.right() < page.width() && wanted.top() + wanted.bottom() < page.height())
        layout.setMargins(wanted);
    return layout;
}

// The toolkit puts a file that is named without its folder into the home folder, wherever it offered one.
class PrintDialog : public QPrintDialog {
  public:
    // proposed is empty when a file was chosen before.
    PrintDialog(QPrinter* printer, const QString& proposed) : QPrintDialog(printer), proposed_(proposed) {}

    void setVisible(bool visible) override {
        QPrintDialog::setVisible(visible);
        QLineEdit* file = FileField();
        if (!visible || !file)
            return;
        offered_ = QFileInfo(file->text()).absoluteDir();
        if (!proposed_.isEmpty())
            file->setText(offered_.absoluteFilePath(proposed_));
    }
    void accept() override {
        QLineEdit* file = FileField();
        if (file && !file->text().isEmpty())
            file->setText(offered_.absoluteFilePath(file->text()));
        QPrintDialog::accept();
    }

  private:
    [[nodiscard]] QLineEdit* FileField() const { return findChild<QLineEdit*>(QStringLiteral("filename")); }

    QString proposed_;
    QDir offered_; // the folder of the file that the dialog proposed
};

// Without a printer the toolkit warns that the dialog cannot be used, in which it is mistaken.
std::unique_ptr<QPageSetupDialog> PageSetupDialogFor(QPrinter& printer) {
    QLoggingCategory* log = QLoggingCategory::defaultCategory();
    const bool warns = log->isWarningEnabled();
    log->setEnabled(QtWarningMsg, false);
    auto dialog = std::make_unique<QPageSetupDialog>(&printer);
    log->setEnabled(QtWarningMsg, warns);
    return dialog;
}

} // namespace

struct PrintJobPeer {
    QPrinter printer{QPrinter::HighResolution};
    QPainter painter;
    bool pageWanted = false;  // the next drawing begins a new page
    bool printerGone = false; // the one that was set up is not there; another will not do
    OutputFile file;
    QString proposedFile;
    QString wantedFile; // what the job writes to in the end; empty for a printer

    [[nodiscard]] bool IsUsable() const {
        return painter.isActive() && printer.printerState() != QPrinter::Aborted &&
               printer.printerState() != QPrinter::Error;
    }
    // Begins with the temporary file in the wanted one's place, for which CommitJob or CancelJob puts it
    // back.
    [[nodiscard]] bool Begin() {
        wantedFile = printer.outputFileName();
        if (wantedFile.isEmpty())
            return printer.outputFormat() != QPrinter::PdfFormat && !printerGone && painter.begin(&printer);
        if (!file.Begin(QFile::encodeName(wantedFile).toStdString()))
            return false;
        printer.setOutputFileName(QFile::decodeName(file.WritePath().c_str()));
        if (painter.begin(&printer))
            return true;
        file.Drop();
        printer.setOutputFileName(wantedFile);
        errno = EIO;
        return false;
    }
    [[nodiscard]] QString OutputFileName() const {
        return painter.isActive() ? wantedFile : printer.outputFileName();
    }
};

BPrintJob::BPrintJob(const char* name) : peer_(std::make_unique<PrintJobPeer>()) {
    peer_->printer.setDocName(QString::fromUtf8(name));
    peer_->printer.setCreator(QStringLiteral("Quorvan"));
}

BPrintJob::~BPrintJob() {
    CancelJob();
}

void BPrintJob::ProposeFile(const char* name) {
    peer_->proposedFile = QString::fromUtf8(name).replace('/', '-') + QStringLiteral(".pdf");
}

status_t BPrintJob::ConfigPage() {
    const std::unique_ptr<QPageSetupDialog> dialog = PageSetupDialogFor(peer_->printer);
    dialog->setObjectName(QStringLiteral("page setup dialog"));
    return RunDialog(*dialog) == QDialog::Accepted ? B_OK : B_ERROR;
}

status_t BPrintJob::ConfigJob() {
    const bool named = !peer_->printer.outputFileName().isEmpty();
    PrintDialog dialog(&peer_->printer, named ? QString() : peer_->proposedFile);
    dialog.setObjectName(QStringLiteral("print dialog"));
    dialog.setOptions(QAbstractPrintDialog::PrintToFile | QAbstractPrintDialog::PrintShowPageSize);
    if (RunDialog(dialog) != QDialog::Accepted)
        return B_ERROR;
    peer_->printerGone = false;
    return B_OK;
}

BMessage* BPrintJob::Settings() const {
    const QPrinter& printer = peer_->printer;
    QPageLayout layout = printer.pageLayout();
    layout.setUnits(QPageLayout::Point);
    const QSizeF size = layout.pageSize().size(QPageSize::Point);
    const QMarginsF margins = layout.margins();
    auto settings = std::make_unique<BMessage>();
    settings->AddString("page size", layout.pageSize().key().toUtf8().constData());
    settings->AddFloat("page width", static_cast<float>(size.width()));
    settings->AddFloat("page height", static_cast<float>(size.height()));
    settings->AddFloat("left margin", static_cast<float>(margins.left()));
    settings->AddFloat("top margin", static_cast<float>(margins.top()));
    settings->AddFloat("right margin", static_cast<float>(margins.right()));
    settings->AddFloat("bottom margin", static_cast<float>(margins.bottom()));
    settings->AddBool("landscape", layout.orientation() == QPageLayout::Landscape);
    settings->AddString("printer", printer.printerName().toUtf8().constData());
    settings->AddString("output file", peer_->OutputFileName().toUtf8().constData());
    settings->AddInt32("copies", printer.copyCount());
    settings->AddInt32("resolution", printer.resolution());
    settings->AddBool("colour", printer.colorMode() == QPrinter::Color);
    return settings.release();
}

void BPrintJob::SetSettings(const BMessage* message) {
    QPrinter& printer = peer_->printer;
    if (!message || peer_->painter.isActive())
        return;
    const QString name = QString::fromStdString(Text(*message, "printer"));
    const QString file = QString::fromStdString(Text(*message, "output file"));
    peer_->printerGone = !name.isEmpty() && QPrinterInfo::printerInfo(name).isNull();
    if (!name.isEmpty() && !peer_->printerGone)
        printer.setPrinterName(name);
    if (!file.isEmpty())
        printer.setOutputFileName(file);
    printer.setPageLayout(LayoutOf(*message, printer.pageLayout()));
    printer.setCopyCount(Whole(*message, "copies", printer.copyCount(), 1, MaxCopies));
    printer.setResolution(Whole(*message, "resolution", printer.resolution(), MinResolution, MaxResolution));
    bool colour = printer.colorMode() == QPrinter::Color;
    message->FindBool("colour", &colour);
    printer.setColorMode(colour ? QPrinter::Color : QPrinter::GrayScale);
}

bool BPrintJob::BeginJob() {
    return !peer_->painter.isActive() && peer_->Begin();
}

BRect BPrintJob::PrintableRect() const {
    BRect printable = FromQt(peer_->printer.pageLayout().paintRect(QPageLayout::Point));
    printable.OffsetTo(0, 0);
    return printable;
}

void BPrintJob::DrawView(BView* view, BRect rect, BPoint where) {
    if (!peer_->IsUsable() || !rect.IsValid())
        return;
    if (peer_->pageWanted)
        peer_->printer.newPage();
    peer_->pageWanted = false;
    QPainter& painter = peer_->painter;
    const double scale = peer_->printer.resolution() / PointsPerInch;
    painter.save();
    painter.scale(scale, scale);
    painter.translate(ToQt(where - rect.LeftTop()));
    painter.setClipRect(ToQt(rect));
    DrawTree(view, painter, rect);
    painter.restore();
}

void BPrintJob::SpoolPage() {
    if (peer_->IsUsable() && peer_->pageWanted)
        peer_->printer.newPage();
    peer_->pageWanted = true;
}

bool BPrintJob::CommitJob() {
    if (!peer_->painter.isActive())
        return false;
    const bool usable = peer_->IsUsable();
    const bool ended = peer_->painter.end();
    peer_->printer.setOutputFileName(peer_->wantedFile);
    if (!ended || !usable) {
        peer_->file.Drop();
        errno = EIO;
        return false;
    }
    return peer_->file.Commit();
}

void BPrintJob::CancelJob() {
    if (!peer_->painter.isActive())
        return;
    peer_->printer.abort();
    peer_->painter.end();
    peer_->file.Drop();
    peer_->printer.setOutputFileName(peer_->wantedFile);
}
