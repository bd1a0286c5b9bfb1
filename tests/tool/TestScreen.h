#ifndef NIB_TESTS_TEST_SCREEN_H
#define NIB_TESTS_TEST_SCREEN_H

#include "Picture.h"

#include <gtest/gtest.h> // before Xlib, whose macros take names from it
#include <optional>
#include <string>
#include <X11/Xlib.h>

/// The X server, asked on a connection of the test's own: what it shows, not what GL says.
class TestScreen
{
public:
    TestScreen();
    ~TestScreen();
    TestScreen(const TestScreen&) = delete;
    TestScreen& operator=(const TestScreen&) = delete;

    bool IsThere() const { return m_display; }
    Display* Connection() const { return m_display; }

    std::optional<Window> WindowNamed(const std::string& name) const;
    Picture Content(Window window, int width, int height) const;

    /// What the server shows once it equals @p expected; after 20 seconds, whatever it shows then.
    /// The frames travel on another connection than the test's questions, so the last may still be
    /// under way when the tool says that it is done.
    Picture ContentOnceEqual(Window window, const Picture& expected) const;

    /// As a window manager does for a user who closes the window.
    void AskToClose(Window window) const;

private:
    Display* m_display;
};

#endif
