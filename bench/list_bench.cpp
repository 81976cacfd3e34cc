// Prints how long the main window takes to fill its list with a portfolio beside a walk of the same records,
// and to sort it as a click on a header does beside a sort of the same texts; how long it takes to select all
// rows, to sort, show and delete every second one, and to follow a key or scroll in between. The window is
// the program's own, on the toolkit's offscreen platform unless QT_QPA_PLATFORM says otherwise.
//
//   list_bench [--records N] [--rounds N] [--folder PATH]

#include <algorithm>
#include <chrono>
#include <cstddef>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <filesystem>
#include <random>
#include <string>
#include <string_view>
#include <vector>

#include <QApplication>
#include <QListView>
#include <QTest>

#include "BenchOptions.h"
#include "ColumnListView/ColumnListView.h"
#include "app/NorvelApp.h"
#include "app/NorvelWindow.h"
#include "app/model/PortfolioRules.h"
#include "app/rows/NorvelItem.h"
#include "app/state/AppState.h"
#include "app/state/MessageCodes.h"
#include "util/CharacterBuffer.h"
#include "util/interface/InterfaceHelpers.h"

namespace {

INVESTMENT_DATA MakeInvestment(long i, unsigned random) {
    INVESTMENT_DATA record{};
    CopyText(record.Portfolio, "Full");
    FormatInto(record.Name, sizeof record.Name, "Investment %u", random % 1'000'000);
    FormatInto(record.Ticker, sizeof record.Ticker, "T%06ld", i % 1'000'000);
    CopyText(record.Type, i % 3 == 0 ? "Mutual Fund" : "Common Stock");
    CopyText(record.Agent, "Broker & Sons");
    CopyText(record.Risk, i % 10 == 3 ? "Med" : "Low");
    record.Shares = static_cast<float>(random % 1000);
    record.Price = static_cast<float>(random % 20'000) / 8;
    record.PrevPrice = record.Price;
    record.Value = record.Shares * record.Price;
    record.Date = {3, 3, 2001};
    record.Retire = i % 2 == 0;
    return record;
}

template <std::size_t Count>
bool Create(DATABASE& database, const std::string& path, const std::array<COLUMN_ENTRY, Count>& columns) {
    return database.Create(path.c_str(), "benchmark", Count, columns.data()) == 0;
}

bool MakeFolder(const std::string& folder, long records) {
    DATABASE portfolios(nullptr);
    DATABASE investments(nullptr);
    DATABASE categories(nullptr);
    if (!Create(portfolios, folder + "/portfol.db", PortfolioColumns) ||
        !Create(investments, folder + "/invest.db", InvestmentColumns) ||
        !Create(categories, folder + "/misc.db", CategoryColumns))
        return false;
    for (const char* name : {"Full", "Empty"}) {
        PORTFOLIO_DATA portfolio{};
        CopyText(portfolio.Name, name);
        portfolios.Append(&portfolio);
    }
    investments.SetImmediateHeaderWrite(0);
    std::minstd_rand random;
    for (long i = 0; i < records; ++i) {
        const INVESTMENT_DATA record = MakeInvestment(i, static_cast<unsigned>(random()));
        if (investments.Append(&record) != i)
            return false;
    }
    return investments.SetImmediateHeaderWrite(1) == 0;
}

template <class Work>
double Seconds(Work work) {
    const auto start = std::chrono::steady_clock::now();
    work();
    return std::chrono::duration<double>(std::chrono::steady_clock::now() - start).count();
}

ColumnListView* FindList(BView* view) {
    if (auto* list = dynamic_cast<ColumnListView*>(view))
        return list;
    for (int32 i = 0; i < view->CountChildren(); ++i)
        if (ColumnListView* list = FindList(view->ChildAt(i)))
            return list;
    return nullptr;
}

void Show(NorvelWindow& window, const char* portfolio) {
    BMessage message(MessagePortfolioSelected);
    message.AddString(PortfolioNameField, portfolio);
    window.MessageReceived(&message);
}

// As SumOfValues, with the result set there already: nothing but the walk.
double SumOfWalkedValues() {
    double sum = 0;
    DATABASE& file = *app_state->investments;
    for (const void* data = file.QueryGetFirst(nullptr); data; data = file.QueryGetNext(nullptr)) {
        INVESTMENT_DATA record;
        std::memcpy(&record, data, offsetof(INVESTMENT_DATA, Unused));
        sum += static_cast<double>(record.Value);
    }
    return sum;
}

double SumOfValues() {
    double sum = 0;
    const bool read =
        ForEachInvestment(*app_state->investments, "Full", [&](const INVESTMENT_DATA& record, long) {
            sum += static_cast<double>(record.Value);
        });
    return read ? sum : -1;
}

void Print(const char* what, const char* peer, double ours, double theirs, long records,
           const char* limit = "") {
    std::printf("%-18s %8.2f ms %6.0f ns a row   %-26s %8.2f ms   ratio %5.2f%s\n", what, ours * 1e3,
                ours * 1e9 / static_cast<double>(records), peer, theirs * 1e3, ours / theirs, limit);
}

void MeasureFill(NorvelWindow& window, const OPTIONS& options) {
    double fill = 1e9;
    double fillAndPaint = 1e9;
    double queryAndWalk = 1e9;
    double walk = 1e9;
    double sum = 0;
    for (int i = 0; i < options.rounds; ++i) {
        queryAndWalk = std::min(queryAndWalk, Seconds([&] { sum += SumOfValues(); }));
        walk = std::min(walk, Seconds([&] { sum += SumOfWalkedValues(); }));
        Show(window, "Empty");
        const double filled = Seconds([&] { Show(window, "Full"); });
        fill = std::min(fill, filled);
        fillAndPaint = std::min(fillAndPaint, filled + Seconds([&] { window.UpdateIfNeeded(); }));
    }
    Print("fill the list", "walk the records", fill, walk, options.records, " (at most 10)");
    Print("fill the list", "query and walk the records", fill, queryAndWalk, options.records);
    Print("fill and paint it", "walk the records", fillAndPaint, walk, options.records);
    std::printf("(sum %.0f)\n", sum / (2 * options.rounds));
}

// The texts of a column as a sort of nothing but them would have them.
std::vector<std::string> Texts(const ColumnListView& list, int32 column) {
    std::vector<std::string> texts;
    for (int32 i = 0; i < list.CountItems(); ++i) {
        std::string text = static_cast<const NorvelItem*>(list.ItemAt(i))->Text(column);
        for (char& letter : text)
            letter = letter >= 'a' && letter <= 'z' ? static_cast<char>(letter - 'a' + 'A') : letter;
        texts.push_back(std::move(text));
    }
    return texts;
}

void MeasureSort(NorvelWindow& window, const OPTIONS& options, InvestmentColumn by, const char* name) {
    const auto column = static_cast<int32>(by);
    double sort = 1e9;
    double peer = 1e9;
    for (int i = 0; i < options.rounds; ++i) {
        Show(window, "Full"); // new rows, none of which has formatted its figures
        ColumnListView* list = FindList(window.FindView("top view"));
        list->SetSortKey(-1);
        sort = std::min(sort, Seconds([&] { list->SetSortKey(column); }));
        Show(window, "Full");
        std::vector<std::string> texts = Texts(*list, column);
        peer = std::min(peer, Seconds([&] { std::stable_sort(texts.begin(), texts.end()); }));
    }
    Print(name, "sort its upper-case texts", sort, peer, options.records, " (at most 500 ms)");
}

// The longest that one of many keys and ways to scroll takes until the window shows it.
double LongestStep(NorvelWindow& window, ColumnListView& list) {
    double longest = 0;
    const auto step = [&](const auto& work) {
        longest = std::max(longest, Seconds([&] {
                               work();
                               window.UpdateIfNeeded();
                           }));
    };
    QWidget* rows = nullptr;
    for (const QWidget* top : QApplication::topLevelWidgets())
        rows = rows ? rows : top->findChild<QListView*>();
    for (const Qt::Key key :
         {Qt::Key_Down, Qt::Key_PageDown, Qt::Key_Down, Qt::Key_End, Qt::Key_Up, Qt::Key_Home})
        step([&] { QTest::keyClick(rows, key); });
    for (int32 row = 0; row < list.CountItems(); row += list.CountItems() / 10 + 1)
        step([&] { list.ScrollToRow(row); });
    return longest;
}

void MeasureSelection(NorvelWindow& window, const OPTIONS& options) {
    double selectAll = 1e9;
    double scatter = 1e9;
    double removal = 1e9;
    double step = 1e9;
    double stepAfterScatter = 1e9;
    ColumnListView* list = FindList(window.FindView("top view"));
    list->MakeFocus();
    for (int i = 0; i < options.rounds; ++i) {
        Show(window, "Full");
        list->SetSortKey(static_cast<int32>(InvestmentColumn::Retire));
        const auto settle = [&] { window.UpdateIfNeeded(); };
        const auto scatterAll = [&] {
            list->Select(0, list->CountItems() / 2 - 1);
            list->SetSortKey(static_cast<int32>(InvestmentColumn::Ticker));
            settle();
        };
        selectAll = std::min(selectAll, Seconds([&] {
                                 list->Select(0, list->CountItems() - 1);
                                 settle();
                             }));
        step = std::min(step, LongestStep(window, *list));
        scatter = std::min(scatter, Seconds(scatterAll));
        stepAfterScatter = std::min(stepAfterScatter, LongestStep(window, *list));
        list->SetSortKey(static_cast<int32>(InvestmentColumn::Retire));
        scatterAll();
        std::vector<const BListItem*> selected;
        for (int32 row = 0; row < list->CountItems(); ++row)
            if (list->IsItemSelected(row))
                selected.push_back(list->ItemAt(row));
        removal = std::min(removal, Seconds([&] {
                               list->RemoveSelected();
                               settle();
                           }));
        for (const BListItem* row : selected)
            delete row;
        if (list->CountItems() != options.records / 2)
            std::puts("the wrong rows went");
    }
    const auto print = [](const char* what, double seconds, int limit) {
        std::printf("%-52s %8.2f ms (at most %d)\n", what, seconds * 1e3, limit);
    };
    print("select all", selectAll, 500);
    print("the longest key or scroll with all selected", step, 50);
    print("sort with every second one selected", scatter, 500);
    print("the longest key or scroll with these selected", stepAfterScatter, 50);
    print("delete every second one", removal, 500);
}

int Measure(const OPTIONS& options, const std::string& folder) {
    setenv("QT_QPA_PLATFORM", "offscreen", 0);
    BApplication::SetExecutablePath((folder + "/quorvan").c_str());
    NorvelApp application;
    auto* window = static_cast<NorvelWindow*>(GetAppWindow(be_app, "Quorvan"));
    if (!window)
        return 1;
    window->Lock();
    MeasureFill(*window, options);
    MeasureSort(*window, options, InvestmentColumn::Name, "sort by Name");
    MeasureSort(*window, options, InvestmentColumn::Value, "sort by Value");
    MeasureSelection(*window, options);
    window->Unlock();
    application.PostMessage(B_QUIT_REQUESTED);
    application.Run();
    return 0;
}

} // namespace

int main(int argc, char** argv) {
    OPTIONS options(100'000);
    if (!ReadOptions(argc, argv, &options)) {
        std::fprintf(stderr, "usage: list_bench [--records N] [--rounds N] [--folder PATH]\n");
        return 2;
    }
    std::string folder = options.folder + "/list_bench.XXXXXX";
    if (mkdtemp(folder.data()) == nullptr) {
        std::perror(folder.c_str());
        return 1;
    }
    const int result = MakeFolder(folder, options.records) ? Measure(options, folder) : 1;
    std::filesystem::remove_all(folder);
    return result;
}
