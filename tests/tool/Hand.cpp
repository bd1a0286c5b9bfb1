#include "Hand.h"

#include <X11/extensions/XTest.h>
#include <X11/keysym.h>

Hand::~Hand()
{
    if (m_isPressed)
        Release();
}

bool Hand::IsThere() const
{
    int event = 0, error = 0, major = 0, minor = 0;
    return XTestQueryExtension(m_display, &event, &error, &major, &minor);
}

void Hand::MoveTo(const Spot& spot)
{
    XTestFakeMotionEvent(m_display, DefaultScreen(m_display), spot.x, spot.y, CurrentTime);
    XSync(m_display, False);
}

void Hand::Press()
{
    XTestFakeButtonEvent(m_display, 1, True, CurrentTime);
    XSync(m_display, False);
    m_isPressed = true;
}

void Hand::Release()
{
    XTestFakeButtonEvent(m_display, 1, False, CurrentTime);
    XSync(m_display, False);
    m_isPressed = false;
}

void Hand::Write(const std::vector<Spot>& spots)
{
    MoveTo(spots.front());
    Press();
    for (std::size_t i = 1; i < spots.size(); ++i)
        MoveTo(spots[i]);
    Release();
}

void Hand::Type(KeySym key)
{
    SetKey(key, true);
    SetKey(key, false);
}

void Hand::TypeWithControl(KeySym key)
{
    SetKey(XK_Control_L, true);
    Type(key);
    SetKey(XK_Control_L, false);
}

void Hand::SetKey(KeySym key, bool isDown)
{
    XTestFakeKeyEvent(m_display, XKeysymToKeycode(m_display, key), isDown, CurrentTime);
    XSync(m_display, False);
}
