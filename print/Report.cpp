#include "print/Report.h"

#include <filesystem>
#include <optional>
#include <string>
#include <utility>

#include "app/model/PortfolioRules.h"
#include "platform/PrintJob.h"
#include "platform/Window.h"
#include "print/PrinterView.h"
#include "util/interface/InterfaceHelpers.h"

namespace {

// Attaches the hidden view to the window, if there is one, while it lives.
class HiddenPage {
  public:
    HiddenPage(BWindow* window, std::unique_ptr<BView> view) : view_(std::move(view)), attached_(window) {
        view_->Hide();
        if (window)
            window->AddChild(view_.get());
    }
    HiddenPage(const HiddenPage&) = delete;
    HiddenPage& operator=(const HiddenPage&) = delete;
    ~HiddenPage() {
        if (attached_)
            view_->RemoveSelf();
    }
    [[nodiscard]] BView* View() const { return view_.get(); }

  private:
    std::unique_ptr<BView> view_;
    bool attached_;
};

// The toolkit's dialog asks before a file is chosen that exists; a report into the file that was chosen
// before must not take another portfolio's place unasked either.
bool MayWrite(const BMessage& settings) {
    const char* file = "";
    std::error_code error;
    if (settings.FindString("output file", &file) != B_OK || !std::filesystem::is_regular_file(file, error))
        return true;
    const bool no =
        YesNoBox((std::string("The file ") + file + " exists. Replace it by this report?").c_str());
    return !no;
}

// Whether the settings were chosen in both dialogs, and printed with as far as is known.
constexpr const char* SettledField = "settled";

void KeepSettings(const BPrintJob& job, bool settled, std::unique_ptr<BMessage>& settings) {
    settings.reset(job.Settings());
    settings->AddBool(SettledField, settled);
}

bool IsSettled(const BMessage& settings) {
    bool settled = false;
    return settings.FindBool(SettledField, &settled) == B_OK && settled;
}

bool ConfigureJob(BPrintJob& job, std::unique_ptr<BMessage>& settings) {
    if (!settings)
        settings = std::make_unique<BMessage>(FirstPrintSettings());
    job.SetSettings(settings.get());
    if (IsSettled(*settings)) {
        if (MayWrite(*settings))
            return true;
    } else {
        if (job.ConfigPage() != B_OK)
            return false;
        KeepSettings(job, false, settings);
    }
    if (job.ConfigJob() != B_OK)
        return false;
    KeepSettings(job, true, settings);
    return true;
}

} // namespace

ReportResult PrintReport(BPrintJob& job, BWindow* window, const char* portfolio, DATABASE& investments) {
    if (!job.BeginJob())
        return ReportResult::NotPrinted;
    const std::optional<float> total = TotalValue(investments, portfolio);
    bool read = total.has_value();
    if (read) {
        auto view = std::make_unique<PrinterView>(job.PrintableRect(), portfolio, *total, &investments);
        const PrinterView& drawn = *view;
        const HiddenPage page(window, std::move(view));
        job.DrawView(page.View(), page.View()->Bounds(), {0, 0});
        read = drawn.HasAll();
    }
    if (!read) {
        job.CancelJob();
        return ReportResult::NotRead;
    }
    job.SpoolPage();
    return job.CommitJob() ? ReportResult::Printed : ReportResult::NotPrinted;
}

BMessage FirstPrintSettings() {
    constexpr float halfInch = 36;
    BMessage settings;
    for (const char* name : {"left margin", "top margin", "right margin", "bottom margin"})
        settings.AddFloat(name, halfInch);
    return settings;
}

ReportResult RunReportJob(BWindow* window, const char* portfolio, DATABASE& investments,
                          std::unique_ptr<BMessage>& settings) {
    BPrintJob job(ReportJobName);
    job.ProposeFile(portfolio);
    if (!ConfigureJob(job, settings))
        return ReportResult::Cancelled;
    const ReportResult result = PrintReport(job, window, portfolio, investments);
    if (result == ReportResult::NotPrinted)
        KeepSettings(job, false, settings);
    return result;
}
