// The built program as assistive technology hears it: over the accessibility bus, on a display and a session
// bus of the test's own. It is worked by the actions that the bus offers.
#include <gtest/gtest.h>

#include <filesystem>
#include <optional>
#include <set>
#include <string>
#include <vector>

#include <QCoreApplication>
#include <QDBusArgument>
#include <QDBusConnection>
#include <QDBusMessage>
#include <QDBusVariant>

#include "DataFolder.h"
#include "Session.h"
#include "tools/SampleData.h"

namespace {

constexpr const char* Accessible = "org.a11y.atspi.Accessible";

// One element and all below it, as of the moment it was read.
struct Element {
    QString service;
    QString path;
    std::string role;
    std::string name;
    std::string description;
    std::vector<Element> children;

    [[nodiscard]] bool IsThere() const { return !path.isEmpty(); }
};

class AccessibilityBus {
  public:
    // Without a value when there is no such bus to be had.
    static std::optional<AccessibilityBus> Connect(const std::string& sessionBus) {
        const auto session = QDBusConnection::connectToBus(QString::fromStdString(sessionBus), "session");
        const QDBusMessage address = session.call(
            QDBusMessage::createMethodCall("org.a11y.Bus", "/org/a11y/bus", "org.a11y.Bus", "GetAddress"));
        if (address.type() != QDBusMessage::ReplyMessage)
            return std::nullopt;
        AccessibilityBus bus;
        bus.connection_ = QDBusConnection::connectToBus(address.arguments().value(0).toString(), "a11y");
        return bus.connection_.isConnected() ? std::optional(bus) : std::nullopt;
    }

    // The program with everything below it; nothing while it is not there, or when something of it went while
    // it was read.
    [[nodiscard]] Element Program() {
        gone_ = false;
        Element found;
        for (const Element& program :
             Children({"org.a11y.atspi.Registry", "/org/a11y/atspi/accessible/root", "", "", "", {}}))
            if (Property(program, "Name") == "Quorvan")
                found = Whole(program);
        return gone_ ? Element() : found;
    }
    [[nodiscard]] bool IsSelected(const Element& element) {
        constexpr quint32 selected = 1U << 23U;
        gone_ = false;
        const auto states = Ask(Call(element, Accessible, "GetState")).value<QDBusArgument>();
        quint32 first = 0;
        states.beginArray();
        states >> first;
        states.endArray();
        return (first & selected) != 0;
    }
    void Press(const Element& element) const {
        QDBusMessage call = Call(element, "org.a11y.atspi.Action", "DoAction");
        call << 0;
        connection_.call(call);
    }

  private:
    static QDBusMessage Call(const Element& element, const char* interface, const char* method) {
        return QDBusMessage::createMethodCall(element.service, element.path, interface, method);
    }
    [[nodiscard]] QVariant Ask(const QDBusMessage& call) {
        const QDBusMessage reply = connection_.call(call);
        gone_ = gone_ || reply.type() != QDBusMessage::ReplyMessage;
        return gone_ ? QVariant() : reply.arguments().value(0);
    }
    [[nodiscard]] std::string Property(const Element& element, const char* name) {
        QDBusMessage call = Call(element, "org.freedesktop.DBus.Properties", "Get");
        call << Accessible << name;
        return Ask(call).value<QDBusVariant>().variant().toString().toStdString();
    }
    [[nodiscard]] std::vector<Element> Children(const Element& element) {
        std::vector<Element> children;
        const QVariant reply = Ask(Call(element, Accessible, "GetChildren"));
        if (gone_)
            return children;
        const auto list = reply.value<QDBusArgument>();
        for (list.beginArray(); !list.atEnd();) {
            QDBusObjectPath path;
            list.beginStructure();
            list >> children.emplace_back().service >> path;
            list.endStructure();
            children.back().path = path.path();
        }
        list.endArray(); // which lets go of what beginArray made
        return children;
    }
    [[nodiscard]] Element Whole(Element element) {
        element.role = Ask(Call(element, Accessible, "GetRoleName")).toString().toStdString();
        element.name = Property(element, "Name");
        element.description = Property(element, "Description");
        for (const Element& child : Children(element))
            element.children.push_back(Whole(child));
        return element;
    }

    QDBusConnection connection_{""};
    bool gone_ = false; // something that was asked is not there any more
};

// The first element at or below `top` with this role, and this name if one is given; an empty one when there
// is none.
const Element& Find(const Element& top, const std::string& role, const std::string& name = "") {
    static const Element nothing;
    if (top.role == role && (name.empty() || top.name == name))
        return top;
    for (const Element& child : top.children)
        if (const Element& found = Find(child, role, name); found.IsThere())
            return found;
    return nothing;
}

// Everything that a person can do something with, or that says something, has a name. The rest holds things
// together.
void ExpectNamed(const Element& element, const std::string& where) {
    static const std::set<std::string> silent{"filler", "separator", "panel", "scroll bar"};
    const std::string here = where + " > " + element.role + " '" + element.name + "'";
    EXPECT_NE(element.role, "") << here;
    EXPECT_NE(element.role, "unknown") << here;
    EXPECT_TRUE(silent.contains(element.role) || !element.name.empty()) << here;
    for (const Element& child : element.children)
        ExpectNamed(child, here);
}

class Session {
  public:
    Session() {
        std::filesystem::create_directory(folder_.File("runtime"));
        std::filesystem::permissions(folder_.File("runtime"), std::filesystem::perms::owner_all);
        setenv("XDG_RUNTIME_DIR", folder_.File("runtime").c_str(), 1);
        // What the bus starts gets its environment.
        bus_.emplace(std::vector<std::string>{"dbus-daemon", "--session", "--nofork", "--print-address="});
        setenv("DBUS_SESSION_BUS_ADDRESS", bus_->Place().c_str(), 1);
        setenv("QT_LINUX_ACCESSIBILITY_ALWAYS_ON", "1", 1);
        std::filesystem::copy(QUORVAN_PROGRAM, folder_.File("quorvan"));
        DATABASE portfolios(folder_.File("portfol.db").c_str());
        DATABASE investments(folder_.File("invest.db").c_str());
        EXPECT_TRUE(AppendSamplePortfolios(portfolios) && AppendSampleInvestments(investments));
    }
    [[nodiscard]] bool Connect() {
        if (display_.IsReady() && !bus_->Place().empty())
            accessibility_ = AccessibilityBus::Connect(bus_->Place());
        return accessibility_.has_value();
    }
    void Start() { program_ = std::make_unique<Process>(std::vector<std::string>{folder_.File("quorvan")}); }
    // Waits until there is such an element, or none any more, and looks at the whole program then.
    [[nodiscard]] bool Await(const std::string& role, const std::string& name, bool there = true) {
        return WaitUntil([&] {
            seen_ = accessibility_->Program();
            return seen_.IsThere() && Find(seen_, role, name).IsThere() == there;
        });
    }
    [[nodiscard]] const Element& Seen() const { return seen_; }
    // Does what the element that was seen offers.
    void Press(const Element& element) const {
        ASSERT_TRUE(element.IsThere());
        accessibility_->Press(element);
    }
    // Selects a row of the list by the keyboard.
    void SelectRow(const Element& row) {
        EXPECT_TRUE(WaitUntil([&] {
            Output("xdotool search --onlyvisible --name '^Quorvan$' windowfocus key Down 2>&1");
            return accessibility_->IsSelected(row);
        }));
    }
    // An item of one of the main window's menus.
    void Choose(const char* menu, const char* item) const {
        Press(Find(Find(seen_, "popup menu", menu), "menu item", item));
    }
    [[nodiscard]] bool HasEndedWell() const {
        return WaitUntil([&] { return program_->HasEnded(); }) && program_->EndedWell();
    }

  private:
    DataFolder folder_;
    Display display_;
    std::optional<Server> bus_;
    std::optional<AccessibilityBus> accessibility_;
    std::unique_ptr<Process> program_;
    Element seen_;
};

TEST(Accessibility, EverythingSaysWhatItIs) {
    int arguments = 0;
    const QCoreApplication application(arguments, nullptr);
    Session session;
    if (!session.Connect())
        GTEST_SKIP() << "There is no accessibility bus here: dbus-daemon or at-spi2-core does not start.";
    session.Start();
    ASSERT_TRUE(session.Await("list", "Investments"));
    ExpectNamed(session.Seen(), "");
    const Element& window = Find(session.Seen(), "frame", "Quorvan");
    EXPECT_TRUE(Find(window, "label", "Total Value: $166,851.94").IsThere());
    EXPECT_EQ(Find(window, "button menu", "Portfolio:").description, "My Retirement Fund");
    const Element& list = Find(window, "list", "Investments");
    ASSERT_EQ(list.children.size(), 16U);
    EXPECT_EQ(list.children[1].name,
              "Birch & Sons, BRCH, Stock, 45.500, 88 1/2, 4026.75, 03-03-2025, yes, Med, "
              "Broker, price down");
    EXPECT_EQ(list.children[12].name,
              "Pension Insurance, Other, 1.000, 48200.00, 48,200.00, 12-31-2024, yes, Low, Insurance, no "
              "earlier price");
    EXPECT_EQ(list.children[1].role, "list item");
    session.SelectRow(list.children[15]);
    EXPECT_EQ(Find(window, "graphic", "column labels").description,
              "Columns: Name, Ticker, Type, Shares, Price, Value, Date, Retire, Risk, Agent");

    constexpr const char* about = "Quorvan version 1.0\n\nThe manual is the file help/Quorvan.html in your "
                                  "Quorvan folder. Help opens it in "
                                  "your web browser.";
    const struct {
        const char *menu, *item;
        const char* title;
        const char* way;         // out of it
        const char *role, *name; // of something that it holds
    } dialogs[] = {
        {"File", "Settings", "Settings", "Cancel", "text", "Password:"},
        {"Portfolio", "Add", "Add a Portfolio", "Cancel", "text", "Name:"},
        {"Portfolio", "Edit", "Edit Portfolio", "Cancel", "text", "Name:"},
        {"Portfolio", "Del", "Are you sure you want to delete this portfolio?", "No", "graphic", "Warning"},
        {"Investment", "Add", "Add an Investment", "Cancel", "button menu", "Type choices"},
        {"Investment", "Edit", "Edit this Investment", "Cancel", "check box", "Retirement"},
        {"Help", "About Quorvan...", about, "Ok", "graphic", "Information"}};
    for (const auto& each : dialogs) {
        session.Choose(each.menu, each.item);
        const char* role = std::string(each.way) == "Cancel" ? "dialog" : "alert message";
        ASSERT_TRUE(session.Await(role, each.title)) << each.title;
        ExpectNamed(session.Seen(), "");
        const Element& dialog = Find(session.Seen(), role, each.title);
        EXPECT_TRUE(Find(dialog, each.role, each.name).IsThere()) << each.title;
        session.Press(Find(dialog, "push button", each.way));
        ASSERT_TRUE(session.Await(role, each.title, false)) << each.title;
    }

    session.Choose("Portfolio", "Chart");
    ASSERT_TRUE(session.Await("button menu", "Chart"));
    ExpectNamed(session.Seen(), "");
    const Element& chart = Find(Find(session.Seen(), "dialog", "Quorvan"), "graphic");
    EXPECT_NE(chart.description.find("Pension Insurance"), std::string::npos) << chart.description;
    EXPECT_NE(chart.name, "");
    session.Choose("File", "Quit");
    EXPECT_TRUE(session.HasEndedWell());
}

} // namespace
