#pragma once

#include <functional>
#include <utility>
#include <vector>

#include <QApplication>
#include <QTest>
#include <QWidget>
#include <gtest/gtest.h>

#include "platform/Application.h"
#include "platform/View.h"
#include "platform/Window.h"

using Codes = std::vector<uint32>;

// A window that keeps the codes of what its controls send.
class RecordingWindow : public BWindow {
  public:
    RecordingWindow(BRect frame, const char* title) : BWindow(frame, title, B_DOCUMENT_WINDOW, 0) {}

    void MessageReceived(BMessage* message) override {
        received.push_back(message->what);
        if (inside)
            inside(message->what);
        BWindow::MessageReceived(message);
    }

    Codes received;
    std::function<void(uint32)> inside; // what a test wants done in the handler
};

// An application with one window, in which a test puts its controls before Show.
struct Stage {
    Stage() : window(new RecordingWindow(BRect(50, 50, 449, 349), "stage")) {}

    template <class View>
    View* Add(View* view) {
        window->AddChild(view);
        return view;
    }
    void Show() {
        window->Show();
        Activate();
    }
    void Activate() const {
        ASSERT_TRUE(QTest::qWaitFor([&] {
            window->Activate();
            return QApplication::activeWindow() == Toolkit();
        }));
    }
    static QWidget* Toolkit() {
        for (QWidget* widget : QApplication::topLevelWidgets())
            if (widget->objectName() == QLatin1String("stage"))
                return widget;
        return nullptr;
    }
    // A widget by its object name.
    template <class Widget>
    static Widget* Find(const char* name) {
        return Toolkit()->findChild<Widget*>(QString::fromUtf8(name));
    }
    // What has been received since the last call, as soon as there are as many messages.
    Codes Received(std::size_t count) {
        EXPECT_TRUE(QTest::qWaitFor([&] { return window->received.size() >= count; }));
        QTest::qWait(0);
        return std::exchange(window->received, {});
    }

    BApplication application{"test"};
    RecordingWindow* window;
};

// A test whose controls stand on a stage.
class StageTest : public testing::Test, protected Stage {};
