#include "Tour.h"

#include "QuoteServer.h"

#include <cstdio>
#include <filesystem>
#include <utility>
#include <vector>

#include <QAbstractItemView>
#include <QAction>
#include <QDialog>
#include <QLineEdit>
#include <QMenu>
#include <QMenuBar>
#include <QProgressBar>
#include <QPushButton>

#include "app/NorvelApp.h"
#include "app/model/PortfolioRules.h"
#include "app/rows/NorvelItem.h"

namespace {

constexpr const char* NewPortfolio = "Tour";
constexpr const char* SamplePortfolio = "My Retirement Fund";

struct ChartStop {
    const char* title;
    const char* picture;
};
constexpr ChartStop Charts[] = {
    {"Value by Ticker", "chart-ticker"},         {"Value by Type", "chart-type"},
    {"Value by Category", "chart-category"},     {"Value by Risk", "chart-risk"},
    {"Value by Retirement", "chart-retirement"}, {"Shares by Investment", "chart-shares"},
    {"Value over Time", "chart-time"},           {"Value by Investment", "chart-investment"},
};

QWidget* MainWindow() {
    for (QWidget* window : QApplication::topLevelWidgets())
        if (window->isVisible() && window->findChild<QMenuBar*>())
            return window;
    return nullptr;
}

int RowsShown() {
    return MainWindow()->findChild<QAbstractItemView*>()->model()->rowCount();
}

bool MainWindowIsFree() {
    return MainWindow() && !QApplication::activeModalWidget() && !QApplication::activePopupWidget();
}

// Into the field with the focus and those after it.
void TypeInto(std::initializer_list<const char*> texts) {
    for (const char* text : texts) {
        if (text != *texts.begin())
            QTest::keyClick(QApplication::focusWidget(), Qt::Key_Tab);
        if (!StepDriver::Field())
            QTest::keyClick(QApplication::focusWidget(), Qt::Key_Tab); // a button beside a field
        StepDriver::TypeOver(text);
    }
}

// The button that opens a pop-up menu in the given window.
void ClickMenuField(QWidget* window) {
    for (auto* button : window->findChildren<QPushButton*>()) {
        if (button->menu()) {
            QTest::mouseClick(button, Qt::LeftButton);
            return;
        }
    }
}

} // namespace

Tour::Tour(std::string folder, std::string pictures, QuoteServer& quotes)
    : folder_(std::move(folder)), pictures_(std::move(pictures)), quotes_(quotes) {
    Then("the main window", [] {
        MainWindow()->resize(1000, 520);
        MainWindow()->move(60, 60);
    });
    Shoot("main-window");
    LookAtMenus();
    LookAtDialogs();
    AddAnInvestment();
    UpdatePrices();
    LookAtCharts();
    PrintReport();
    Leave();
}

Tour::~Tour() {
    FailForStepsLeft();
}

void Tour::Fail(const std::string& sentence) {
    failed_ = true;
    std::fprintf(stderr, "quorvan-tour: %s\n", sentence.c_str());
}

void Tour::Then(const std::string& what, Action action) {
    When(what, MainWindowIsFree, std::move(action));
}

void Tour::Until(const std::string& what, const Condition& condition) {
    Await(
        what, [condition] { return MainWindowIsFree() && condition(); });
}

void Tour::Shoot(const std::string& picture) {
    // A window that has just come is plain until the display has shown it.
    When(
        "picture " + picture, [this, picture] { return pictures_.Take(picture); }, [] {});
}

void Tour::InDialog(const char* title, const std::string& picture, Action action) {
    const Condition shown = [title] {
        const QWidget* modal = QApplication::activeModalWidget();
        return modal && modal->windowTitle() == QString::fromUtf8(title);
    };
    Await(std::string("dialog ") + title, shown);
    Shoot(picture);
    When(std::string("dialog ") + title, shown, std::move(action));
}

void Tour::Choose(const char* menu, const char* item) {
    Then(
        std::string("menu ") + menu, [menu] { ClickTitle(MainWindow(), menu); });
    When(std::string(menu) + " > " + item, OpenMenu, [item] { ClickItem(item); });
}

void Tour::AlertAndAnswer(const char* text, const std::string& picture, const char* button) {
    Await(std::string("alert: ") + text,
          [text] { return Alert() && Alert()->text() == QString::fromUtf8(text); });
    Shoot(picture);
    Answer(text, button);
}

void Tour::LookAtMenus() {
    for (const char* menu : {"File", "Portfolio", "Investment", "Help"}) {
        Then(std::string("menu ") + menu, [menu] { ClickTitle(MainWindow(), menu); });
        Await(std::string("menu ") + menu + " is open", OpenMenu);
        Shoot(std::string("menu-") + menu);
        When(std::string("close menu ") + menu, OpenMenu,
             [] { QTest::keyClick(OpenMenu(), Qt::Key_Escape); });
    }
}

void Tour::LookAtDialogs() {
    Choose("File", "Settings");
    InDialog("Settings", "settings", [] { Key(Qt::Key_Escape); });
    Choose("Portfolio", "Edit");
    InDialog("Edit Portfolio", "portfolio-edit", [] { Key(Qt::Key_Escape); });
    Choose("Portfolio", "Del");
    AlertAndAnswer("Are you sure you want to delete this portfolio?", "portfolio-delete", "No");
    Choose("Help", "About Quorvan...");
    AlertAndAnswer(NorvelApp::AboutText, "about", "Ok");
}

void Tour::AddAnInvestment() {
    Choose("Portfolio", "Add");
    InDialog(
        "Add a Portfolio", "portfolio-add", [] { TypeOver(NewPortfolio, Qt::Key_Return); });
    Until(
        "the new portfolio is empty", [] { return RowsShown() == 0; });
    Then(
        "the Add button", [] { Press(MainWindow(), "add button"); });
    When(
        "the investment form", Field,
        [] {
            TypeInto({"Hornbeam Mills", "HORN", "Stock", "25", "41.5"});
        });
    InDialog("Add an Investment", "investment-add", [] { Key(Qt::Key_Return); });
    Until(
        "what was added is shown and in its file",
        [this] {
            DATABASE file((folder_ + "/invest.db").c_str());
            return RowsShown() == 1 && SelectInvestments(file, NewPortfolio) == 1;
        });
    Then("the selector", [] { ClickMenuField(MainWindow()); });
    Await("the selector's menu", OpenMenu);
    Shoot("portfolio-selector");
    When("back to the sample", OpenMenu, [] { ClickItem(SamplePortfolio); });
}

void Tour::UpdatePrices() {
    constexpr const char* title = "Getting current prices...";
    Then("the Update button", [] { Press(MainWindow(), "Update button"); });
    Await("an update half-way", [this] {
        const QWidget* window = Window(title);
        const auto* bar = window ? window->findChild<QProgressBar*>() : nullptr;
        const std::string ticker = quotes_.HeldTicker();
        return bar && !ticker.empty() && bar->accessibleName().endsWith(QString::fromStdString(" " + ticker));
    });
    Shoot("update");
    When(
        "the update goes on", [] { return Window(title) != nullptr; }, [this] { quotes_.Release(); });
    Until("what was found is in the file", [this] {
        int found = 0;
        int missed = 0;
        DATABASE file((folder_ + "/invest.db").c_str());
        const bool read = ForEachInvestment(file, SamplePortfolio, [&](const INVESTMENT_DATA& record, long) {
            found += record.Price == quotes_.PriceOf(record.Ticker) ? 1 : 0;
            missed += record.QuoteError;
        });
        return read && found > 10 && missed == 1 && RowsShown() > 10;
    });
    Shoot("updated");
}

void Tour::LookAtCharts() {
    Choose("Portfolio", "Chart");
    const Condition shown = [] {
        return QApplication::activeModalWidget() && !QApplication::activePopupWidget();
    };
    for (const ChartStop& chart : Charts) {
        When(
            "the chart menu", shown, [] { ClickMenuField(QApplication::activeModalWidget()); });
        When(std::string("choose ") + chart.title, OpenMenu, [&chart] { ClickItem(chart.title); });
        Await(std::string("chart ") + chart.title, shown);
        Shoot(chart.picture);
    }
    const auto chart = [] { return QApplication::activeModalWidget()->windowHandle(); };
    static constexpr QPoint slice(300, 220);
    When("point to a slice", shown, [chart] { QTest::mouseMove(chart(), slice); });
    Shoot("chart-pointed");
    When("the picture menu", shown, [chart] { QTest::mouseClick(chart(), Qt::RightButton, {}, slice); });
    Await("the picture menu", OpenMenu);
    Shoot("chart-menu");
    When(
        "save a picture", OpenMenu, [] { ClickItem("Save picture..."); });
    InDialog(
        "Save picture", "chart-save", [] { QApplication::activeModalWidget()->close(); });
    When("close the charts", shown, [] { QApplication::activeModalWidget()->close(); });
}

// The report goes into a file, since there may be no printer.
void Tour::PrintReport() {
    const std::string file = folder_ + "/report.pdf";
    Choose("Portfolio", "Print");
    const auto accept = [] { qobject_cast<QDialog*>(QApplication::activeModalWidget())->accept(); };
    const auto shown = [](const char* name) -> Condition {
        return [name] {
            const auto* dialog = qobject_cast<QDialog*>(QApplication::activeModalWidget());
            return dialog && dialog->objectName() == name;
        };
    };
    Await("page set-up", shown("page setup dialog"));
    Shoot("page-setup");
    When("page set-up", shown("page setup dialog"), accept);
    When("print set-up", shown("print dialog"), [file] {
        for (auto* field : QApplication::activeModalWidget()->findChildren<QLineEdit*>())
            if (field->text().endsWith(".pdf"))
                field->setText(QString::fromStdString(file));
    });
    Shoot("print");
    When("print set-up", shown("print dialog"), accept);
    Until("the report is there",
          [file] { return std::filesystem::exists(file) && std::filesystem::file_size(file) > 1000; });
}

void Tour::Leave() {
    Choose("File", "Quit");
}
