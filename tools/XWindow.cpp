#include "XWindow.h"

#include "XConnection.h"

XWindow::XWindow(const std::string& title, int width, int height)
    : m_connection(std::make_unique<XConnection>("--window", title, width, height,
                                                 XConnection::Sizing::Fixed))
{
    m_connection->Show(NoEventMask);
}

XWindow::~XWindow() = default;

void* XWindow::NativeWindow() const
{
    return reinterpret_cast<void*>(m_connection->Handle());
}

bool XWindow::IsOpen()
{
    while (m_connection->Pending() > 0)
    {
        XEvent event{};
        XNextEvent(m_connection->Get(), &event);
        m_connection->Watch(event);
    }
    return !m_connection->IsOver();
}
