#include "playkit/screen.h"

#include <gtest/gtest.h>

#include <chrono>
#include <stdexcept>
#include <thread>

// Behind everything else, for it defines words like None and Bool as macros.
#include <X11/Xlib.h>
#include <X11/Xutil.h>

namespace playkit {

namespace {

const char kSize[] = "800x600x24";

// Windows come and go while they are looked at; the call that misses one says so in its result.
int ignoreError(Display*, XErrorEvent*) {
    return 0;
}

std::string waitForNumber(Process* server) {
    std::string number;
    const bool started = waitUntil([&] {
        number = server->printed();
        return number.find('\n') != std::string::npos;
    });
    if (!started) throw std::runtime_error("the X server does not start");
    return number.substr(0, number.find('\n'));
}

}  // namespace

bool waitUntil(const std::function<bool()>& condition) {
    using Clock = std::chrono::steady_clock;
    const Clock::time_point end = Clock::now() + std::chrono::seconds(60);
    while (!condition()) {
        if (Clock::now() > end) return false;
        std::this_thread::sleep_for(std::chrono::milliseconds(20));
    }
    return true;
}

struct Screen::Connection {
    explicit Connection(const std::string& displayName)
        : name(displayName), display(XOpenDisplay(displayName.c_str())) {
        if (display == nullptr) throw std::runtime_error("the X server does not answer");
        root = DefaultRootWindow(display);
        XSetErrorHandler(ignoreError);
        XSelectInput(display, root, SubstructureNotifyMask);
    }
    ~Connection() { XCloseDisplay(display); }
    Connection(const Connection&) = delete;
    Connection& operator=(const Connection&) = delete;

    XWindowAttributes attributes(Window window) const {
        XWindowAttributes result = {};
        XGetWindowAttributes(display, window, &result);
        return result;
    }
    Window find(const std::string& title) const;
    std::string title(Window window) const;

    std::string name;
    Display* display;
    Window root;
};

std::string Screen::Connection::title(Window window) const {
    // Its type follows the program's locale; the titles here are ASCII in all of them.
    XTextProperty text = {};
    if (XGetWMName(display, window, &text) == 0 || text.value == nullptr) return "";
    const std::string result(reinterpret_cast<const char*>(text.value), text.nitems);
    XFree(text.value);
    return result;
}

Window Screen::Connection::find(const std::string& wanted) const {
    Window ignored = 0;
    Window* children = nullptr;
    unsigned count = 0;
    Window found = 0;
    if (XQueryTree(display, root, &ignored, &ignored, &children, &count) == 0) return found;
    for (unsigned i = 0; i < count; ++i) {
        const bool visible = attributes(children[i]).map_state == IsViewable;
        if (visible && title(children[i]).rfind(wanted, 0) == 0) found = children[i];
    }
    if (children != nullptr) XFree(children);
    return found;
}

Screen::Screen()
    : m_server(
          {"Xvfb", "-displayfd", "1", "-screen", "0", kSize, "-nolisten", "tcp", "-noreset", "-r"}),
      m_connection(std::make_unique<Connection>(":" + waitForNumber(&m_server))) {}

Screen::~Screen() = default;

Environment Screen::environment() const {
    // The desktop's own libraries leave memory behind; leaks of ours show where no window is
    // opened.
    return {{"DISPLAY", m_connection->name},
            {"WAYLAND_DISPLAY", ""},
            {"SDL_VIDEODRIVER", ""},
            {"LSAN_OPTIONS", "detect_leaks=0"}};
}

Screen::WindowId Screen::waitForWindow(const std::string& title) {
    WindowId window = 0;
    waitUntil([&] { return (window = m_connection->find(title)) != 0; });
    return window;
}

std::string Screen::title(WindowId window) const {
    return m_connection->title(window);
}

Size Screen::size(WindowId window) const {
    const XWindowAttributes attributes = m_connection->attributes(window);
    return {attributes.width, attributes.height};
}

Image Screen::grab(WindowId window) const {
    const XWindowAttributes attributes = m_connection->attributes(window);
    Image image;
    XImage* const grabbed = XGetImage(m_connection->display, m_connection->root, attributes.x,
                                      attributes.y, static_cast<unsigned>(attributes.width),
                                      static_cast<unsigned>(attributes.height), AllPlanes, ZPixmap);
    if (grabbed == nullptr) {
        ADD_FAILURE() << "the window does not lie on the screen";
        return image;
    }
    image.width = attributes.width;
    image.height = attributes.height;
    for (int y = 0; y < image.height; ++y) {
        for (int x = 0; x < image.width; ++x) {
            const unsigned long pixel = XGetPixel(grabbed, x, y);
            for (const int shift : {16, 8, 0}) {
                image.bytes.push_back(static_cast<uint8_t>(pixel >> shift & 0xFF));
            }
        }
    }
    XDestroyImage(grabbed);
    return image;
}

void Screen::resize(WindowId window, const Size& size) {
    XMoveResizeWindow(m_connection->display, window, 0, 0, static_cast<unsigned>(size.width),
                      static_cast<unsigned>(size.height));
    XSync(m_connection->display, False);
}

void Screen::press(WindowId window, const std::string& key) {
    XSetInputFocus(m_connection->display, window, RevertToNone, CurrentTime);
    XSync(m_connection->display, False);
    EXPECT_EQ(run({"xdotool", "key", key}, environment()).status, 0);
}

void Screen::close(WindowId window) {
    XEvent event = {};
    event.xclient.type = ClientMessage;
    event.xclient.window = window;
    event.xclient.message_type = XInternAtom(m_connection->display, "WM_PROTOCOLS", False);
    event.xclient.format = 32;
    event.xclient.data.l[0] =
        static_cast<long>(XInternAtom(m_connection->display, "WM_DELETE_WINDOW", False));
    XSendEvent(m_connection->display, window, False, NoEventMask, &event);
    XSync(m_connection->display, False);
}

bool Screen::fullScreenAsked() {
    Display* const display = m_connection->display;
    const Atom state = XInternAtom(display, "_NET_WM_STATE", False);
    const long full = static_cast<long>(XInternAtom(display, "_NET_WM_STATE_FULLSCREEN", False));
    XEvent event = {};
    while (XCheckTypedEvent(display, ClientMessage, &event) != 0) {
        const bool asks = event.xclient.message_type == state && event.xclient.data.l[0] == 1;
        if (asks && event.xclient.data.l[1] == full) return true;
    }
    return false;
}

}  // namespace playkit
