#include "moka/host/XWindowWatch.h"

#include <cstdio>
#include <cstdlib>
#include <utility>

#if __has_include(<xcb/xcb.h>) && !defined(__ANDROID__)
#define MOKA_HAS_XCB 1
#include <dlfcn.h>
#include <xcb/xcb.h>
#endif

namespace Moka::detail {

#ifdef MOKA_HAS_XCB
namespace {

template <class Function>
Function* Find(void* library, char const* name) {
    return library ? reinterpret_cast<Function*>(dlsym(library, name)) : nullptr;
}

// The functions of libxcb that are used here. They are null if libxcb is not installed.
struct Xcb {
    Xcb() : library(dlopen("libxcb.so.1", RTLD_NOW | RTLD_LOCAL)) {}

    explicit operator bool() const {
        return connect && disconnect && hasError && getAttributes && attributesReply && select && flush &&
               poll;
    }

    void* const library;
    decltype(xcb_connect)* connect = Find<decltype(xcb_connect)>(library, "xcb_connect");
    decltype(xcb_disconnect)* disconnect = Find<decltype(xcb_disconnect)>(library, "xcb_disconnect");
    decltype(xcb_connection_has_error)* hasError =
        Find<decltype(xcb_connection_has_error)>(library, "xcb_connection_has_error");
    decltype(xcb_get_window_attributes)* getAttributes =
        Find<decltype(xcb_get_window_attributes)>(library, "xcb_get_window_attributes");
    decltype(xcb_get_window_attributes_reply)* attributesReply =
        Find<decltype(xcb_get_window_attributes_reply)>(library, "xcb_get_window_attributes_reply");
    decltype(xcb_change_window_attributes)* select =
        Find<decltype(xcb_change_window_attributes)>(library, "xcb_change_window_attributes");
    decltype(xcb_flush)* flush = Find<decltype(xcb_flush)>(library, "xcb_flush");
    decltype(xcb_poll_for_event)* poll = Find<decltype(xcb_poll_for_event)>(library, "xcb_poll_for_event");
};

Xcb const& GetXcb() {
    static Xcb const xcb;
    return xcb;
}

// X identifiers have 29 bits; windows of other window systems are pointers.
constexpr std::uintptr_t kXIdentifiers = std::uintptr_t{1} << 29;

void* FindXlib() { return dlopen("libX11.so.6", RTLD_NOW | RTLD_NOLOAD); }

// Returns true if EGL takes the number for a window of an X server: the server that DISPLAY names, or that of
// an Xlib connection. A wl_display begins with a pointer to the description of its interface; an Xlib display
// has the protocol version, which has been 11 since 1987.
bool IsXWindow(void* display, std::uintptr_t window) {
    if (!display) return window < kXIdentifiers || std::getenv("DISPLAY");
    void const* const wayland = dlsym(RTLD_DEFAULT, "wl_display_interface");
    if (wayland && *static_cast<void const* const*>(display) == wayland) return false;
    auto* const getVersion = Find<int(void*)>(FindXlib(), "XProtocolVersion");
    return getVersion && getVersion(display) == 11;
}

struct Server {
    std::string name; // if it is empty, DISPLAY names the server
    bool isKnown = true;
};

// Flushes the application's connection, because the window may have been created a moment ago, and the server
// must know it before another connection uses it.
Server Synchronize(void* display) {
    if (!display) return {};
    void* const xlib = FindXlib();
    auto* const getName = Find<char*(void*)>(xlib, "XDisplayString");
    auto* const sync = Find<int(void*, int)>(xlib, "XSync");
    if (!getName || !sync) return {{}, false};
    sync(display, 0);
    return {getName(display), true};
}

} // namespace

struct XWindowWatch::Impl {
    explicit Impl(xcb_connection_t* connected, xcb_window_t watched)
        : connection(connected), window(watched) {}
    ~Impl() { GetXcb().disconnect(connection); }

    // Not a pixmap, and not a window that only takes input: the driver shows nothing there, or fails later.
    bool CanShow() const {
        Xcb const& xcb = GetXcb();
        xcb_generic_error_t* error = nullptr;
        xcb_get_window_attributes_reply_t* const reply =
            xcb.attributesReply(connection, xcb.getAttributes(connection, window), &error);
        bool const canShow = reply && reply->_class == XCB_WINDOW_CLASS_INPUT_OUTPUT;
        std::free(reply);
        std::free(error);
        return canShow;
    }

    void Select() const {
        std::uint32_t const events = XCB_EVENT_MASK_STRUCTURE_NOTIFY;
        GetXcb().select(connection, window, XCB_CW_EVENT_MASK, &events);
        GetXcb().flush(connection);
    }

    bool TellsOfEnd(xcb_generic_event_t const& event) const {
        int const type = event.response_type & 0x7F;
        if (type == XCB_DESTROY_NOTIFY)
            return reinterpret_cast<xcb_destroy_notify_event_t const&>(event).window == window;
        return type == 0 && reinterpret_cast<xcb_generic_error_t const&>(event).resource_id == window;
    }

    xcb_connection_t* const connection;
    xcb_window_t const window;
    bool isGone = false;
};

std::unique_ptr<XWindowWatch> XWindowWatch::Open(void* display, std::uintptr_t window, std::string* error) {
    Xcb const& xcb = GetXcb();
    if (!xcb || !IsXWindow(display, window)) return nullptr;
    Server const server = Synchronize(display);
    if (!server.isKnown) return nullptr;
    char const* const name = server.name.empty() ? nullptr : server.name.c_str();
    auto impl = std::make_unique<Impl>(xcb.connect(name, nullptr), static_cast<xcb_window_t>(window));
    if (xcb.hasError(impl->connection) != 0) {
        char const* const variable = std::getenv("DISPLAY");
        *error = std::string("the X server \"") +
                 (name       ? name
                  : variable ? variable
                             : "") +
                 "\" cannot be reached; DISPLAY names it unless nativeDisplay is given";
        return nullptr;
    }
    if (window >= kXIdentifiers || !impl->CanShow()) {
        char number[24];
        std::snprintf(number, sizeof number, "0x%lx", static_cast<unsigned long>(window));
        *error =
            std::string("the X server has no window ") + number +
            " to show anything in; nativeWindow must exist before the render thread starts and until it has "
            "stopped";
        return nullptr;
    }
    impl->Select();
    return std::unique_ptr<XWindowWatch>(new XWindowWatch(std::move(impl)));
}

void* XWindowWatch::GetConnection() const { return mImpl->connection; }

bool XWindowWatch::IsGone() {
    Xcb const& xcb = GetXcb();
    while (xcb_generic_event_t* const event = xcb.poll(mImpl->connection)) {
        mImpl->isGone = mImpl->isGone || mImpl->TellsOfEnd(*event);
        std::free(event);
    }
    return mImpl->isGone || xcb.hasError(mImpl->connection) != 0;
}

#else

struct XWindowWatch::Impl {};
std::unique_ptr<XWindowWatch> XWindowWatch::Open(void*, std::uintptr_t, std::string*) { return nullptr; }
void* XWindowWatch::GetConnection() const { return nullptr; }
bool XWindowWatch::IsGone() { return false; }

#endif

XWindowWatch::XWindowWatch(std::unique_ptr<Impl> impl) : mImpl(std::move(impl)) {}
XWindowWatch::~XWindowWatch() = default;

} // namespace Moka::detail
