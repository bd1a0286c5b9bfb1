#include "LiveWindow.h"

#include "PenInput.h"
#include "UserError.h"
#include "XConnection.h"

#include <optional>
#include <X11/extensions/XInput2.h>
#include <X11/keysym.h>
#include <X11/XKBlib.h>

namespace
{

constexpr int kTip = 1; // the button that a pen's tip and a mouse's main button are

/// Turns on the pointer events of every pointer, and gives the number by which the extension's
/// events are known.
int SelectPointers(Display* display, Window window, const std::string& option)
{
    int opcode = 0, firstEvent = 0, firstError = 0;
    int major = 2, minor = 0;
    if (!XQueryExtension(display, "XInputExtension", &opcode, &firstEvent, &firstError) ||
        XIQueryVersion(display, &major, &minor) != 0)
        throw UserError(option + ": the X server has no XInput 2");
    unsigned char bits[XIMaskLen(XI_LASTEVENT)] = {};
    for (const int event : {XI_ButtonPress, XI_ButtonRelease, XI_Motion, XI_DeviceChanged})
        XISetMask(bits, event);
    XIEventMask mask{XIAllMasterDevices, sizeof bits, bits};
    XISelectEvents(display, window, &mask, 1);
    return opcode;
}

std::vector<PenAxis> AxesOf(Display* display, int device)
{
    std::vector<PenAxis> axes;
    int count = 0;
    XIDeviceInfo* const info = XIQueryDevice(display, device, &count);
    for (int i = 0; info && i < info->num_classes; ++i)
    {
        if (info->classes[i]->type != XIValuatorClass)
            continue;
        const auto& valuator = *reinterpret_cast<XIValuatorClassInfo*>(info->classes[i]);
        char* const label = valuator.label ? XGetAtomName(display, valuator.label) : nullptr;
        axes.push_back(
            {valuator.number, label ? label : "", valuator.min, valuator.max, valuator.value});
        XFree(label);
    }
    if (info)
        XIFreeDeviceInfo(info);
    return axes;
}

std::optional<PenReport::Kind> KindOf(const XIDeviceEvent& event)
{
    if (event.evtype == XI_Motion)
        return PenReport::Kind::Move;
    if (event.detail != kTip)
        return std::nullopt;
    return event.evtype == XI_ButtonPress ? PenReport::Kind::Down : PenReport::Kind::Up;
}

LiveEvent::Kind LiveKind(PenReport::Kind kind)
{
    switch (kind)
    {
    case PenReport::Kind::Down: return LiveEvent::Kind::PenDown;
    case PenReport::Kind::Up: return LiveEvent::Kind::PenUp;
    case PenReport::Kind::Move: break;
    }
    return LiveEvent::Kind::PenMove;
}

std::optional<LiveEvent::Kind> Command(Display* display, const XKeyEvent& key)
{
    const auto code = static_cast<KeyCode>(key.keycode);
    const KeySym symbol = XkbKeycodeToKeysym(display, code, XkbGroupForCoreState(key.state), 0);
    if (symbol == XK_Delete)
        return LiveEvent::Kind::Clear;
    if ((key.state & ControlMask) == 0)
        return std::nullopt;
    switch (symbol)
    {
    case XK_z: return LiveEvent::Kind::Undo;
    case XK_n: return LiveEvent::Kind::Clear;
    case XK_s: return LiveEvent::Kind::Save;
    default: return std::nullopt;
    }
}

} // namespace

class LiveWindow::Input
{
public:
    Input(const std::string& option, const std::string& title, int width, int height,
          double startTime)
        : connection(option, title, width, height, XConnection::Sizing::Free),
          m_opcode(SelectPointers(connection.Get(), connection.Handle(), option)),
          m_pens(startTime), m_width(width), m_height(height)
    {
        connection.Show(KeyPressMask | ExposureMask);
    }

    void TakeOne(std::vector<LiveEvent>& events)
    {
        XEvent event{};
        XNextEvent(connection.Get(), &event);
        connection.Watch(event);
        switch (event.type)
        {
        case GenericEvent: TakePointer(event.xcookie, events); break;
        case KeyPress:
            if (const auto command = Command(connection.Get(), event.xkey))
                events.emplace_back().kind = *command;
            break;
        case ConfigureNotify: TakeSize(event.xconfigure, events); break;
        case Expose: events.emplace_back().kind = LiveEvent::Kind::Uncovered; break;
        default: break;
        }
    }

    XConnection connection;

private:
    void TakePointer(XGenericEventCookie& cookie, std::vector<LiveEvent>& events)
    {
        if (cookie.extension != m_opcode || !XGetEventData(connection.Get(), &cookie))
            return;
        if (cookie.evtype == XI_DeviceChanged)
            m_pens.Forget(static_cast<XIDeviceChangedEvent*>(cookie.data)->sourceid);
        else
            TakeReport(*static_cast<XIDeviceEvent*>(cookie.data), events);
        XFreeEventData(connection.Get(), &cookie);
    }

    void TakeReport(const XIDeviceEvent& event, std::vector<LiveEvent>& events)
    {
        const std::optional<PenReport::Kind> kind = KindOf(event);
        if (!kind)
            return;
        if (!m_pens.Knows(event.sourceid))
            m_pens.Describe(event.sourceid, AxesOf(connection.Get(), event.sourceid));
        PenReport report;
        report.kind = *kind;
        report.pointer = event.deviceid;
        report.device = event.sourceid;
        report.milliseconds = static_cast<std::uint32_t>(event.time);
        report.x = static_cast<float>(event.event_x);
        report.y = static_cast<float>(event.event_y);
        report.mask = event.valuators.mask;
        report.maskBytes = event.valuators.mask_len;
        report.values = event.valuators.values;
        if (const std::optional<Ink::Sample> sample = m_pens.Accept(report))
        {
            events.emplace_back().kind = LiveKind(*kind);
            events.back().sample = *sample;
        }
    }

    void TakeSize(const XConfigureEvent& event, std::vector<LiveEvent>& events)
    {
        if (event.width == m_width && event.height == m_height)
            return; // it was moved
        m_width = event.width;
        m_height = event.height;
        events.emplace_back().kind = LiveEvent::Kind::Resize;
        events.back().width = m_width;
        events.back().height = m_height;
    }

    int m_opcode;
    PenInput m_pens;
    int m_width;
    int m_height;
};

LiveWindow::LiveWindow(const std::string& option, const std::string& title, int width, int height,
                       double startTime)
    : m_input(std::make_unique<Input>(option, title, width, height, startTime))
{
}

LiveWindow::~LiveWindow() = default;

void* LiveWindow::NativeWindow() const
{
    return reinterpret_cast<void*>(m_input->connection.Handle());
}

bool LiveWindow::WaitForEvents(std::vector<LiveEvent>& events)
{
    events.clear();
    XConnection& connection = m_input->connection;
    connection.Wait();
    for (int count = connection.Pending(); count > 0; --count)
        m_input->TakeOne(events);
    return !connection.IsOver();
}
