#ifndef NIB_TESTS_HAND_H
#define NIB_TESTS_HAND_H

#include <gtest/gtest.h> // before Xlib, whose macros take names from it
#include <vector>
#include <X11/Xlib.h>

/// A place in a window, in pixels.
struct Spot
{
    int x;
    int y;
    bool operator==(const Spot& other) const { return x == other.x && y == other.y; }
};

/// A hand on the mouse and the keyboard of an X server (through its XTEST extension), over a window
/// in the screen's top left corner. What it does has reached the server when a call returns.
class Hand
{
public:
    explicit Hand(Display* display) : m_display(display) {}
    ~Hand(); ///< lets go of the button

    Hand(const Hand&) = delete;
    Hand& operator=(const Hand&) = delete;

    bool IsThere() const; ///< whether the server has the extension

    void MoveTo(const Spot& spot);
    void Press();
    void Release();
    void Write(const std::vector<Spot>& spots); ///< presses at the first, releases at the last
    void Type(KeySym key);
    void TypeWithControl(KeySym key);

private:
    void SetKey(KeySym key, bool isDown);

    Display* m_display;
    bool m_isPressed = false;
};

#endif
