// Shared by the Windows files: 16-bit text as the system's functions take it, and owners of handles. Store a handle in
// its owner at once; handles are then closed in reverse order.
#pragma once

#include <windows.h>

#include <memory>
#include <type_traits>

namespace velmora::support::win32 {

// Windows' 16-bit text is wchar_t; the library's is char16_t. Both are UTF-16.
static_assert(sizeof(wchar_t) == sizeof(char16_t));
inline const wchar_t* Wide(const char16_t* text) noexcept {
    return reinterpret_cast<const wchar_t*>(text);
}

// Closes a handle with the function for its type.
template <auto close>
struct Closer {
    template <class Handle>
    void operator()(Handle handle) const noexcept {
        static_cast<void>(close(handle));
    }
};

template <class Handle, auto close>
using Owner = std::unique_ptr<std::remove_pointer_t<Handle>, Closer<close>>;

using Module = Owner<HMODULE, &FreeLibrary>;
using RegistryKey = Owner<HKEY, &RegCloseKey>;
using Bitmap = Owner<HBITMAP, &DeleteObject>;
using MemoryDc = Owner<HDC, &DeleteDC>;
using Handle = Owner<HANDLE, &CloseHandle>;

// Selects an object into a device context and restores the previous one at the end.
class Selection {
  public:
    Selection(HDC dc, HGDIOBJ object) noexcept : m_dc(dc), m_before(SelectObject(dc, object)) {}
    ~Selection() { SelectObject(m_dc, m_before); }
    Selection(const Selection&) = delete;
    Selection& operator=(const Selection&) = delete;

  private:
    HDC m_dc;
    HGDIOBJ m_before;
};

// BeginPaint and EndPaint.
class Painting {
  public:
    explicit Painting(HWND window) noexcept : m_window(window), m_dc(BeginPaint(window, &m_paint)) {}
    ~Painting() { EndPaint(m_window, &m_paint); }
    Painting(const Painting&) = delete;
    Painting& operator=(const Painting&) = delete;
    [[nodiscard]] HDC Dc() const noexcept { return m_dc; }

  private:
    HWND m_window;
    PAINTSTRUCT m_paint = {};
    HDC m_dc;
};

// A window's device context.
class WindowDc {
  public:
    explicit WindowDc(HWND window) noexcept : m_window(window), m_dc(GetDC(window)) {}
    ~WindowDc() { ReleaseDC(m_window, m_dc); }
    WindowDc(const WindowDc&) = delete;
    WindowDc& operator=(const WindowDc&) = delete;
    [[nodiscard]] HDC Dc() const noexcept { return m_dc; }

  private:
    HWND m_window;
    HDC m_dc;
};

// Within its scope, new dialogs use the controls that a module's manifest (resource 2) asks for. Nothing changes
// without such a manifest or without the system's support for it.
class ManifestScope {
  public:
    explicit ManifestScope(HMODULE module) noexcept {
        ACTCTXW description = {};
        description.cbSize = sizeof description;
        description.dwFlags = ACTCTX_FLAG_RESOURCE_NAME_VALID | ACTCTX_FLAG_HMODULE_VALID;
        description.lpResourceName = MAKEINTRESOURCEW(2);
        description.hModule = module;
        m_context = CreateActCtxW(&description);
        if (m_context != INVALID_HANDLE_VALUE) m_active = ActivateActCtx(m_context, &m_cookie) != FALSE;
    }
    ~ManifestScope() {
        if (m_active) DeactivateActCtx(0, m_cookie);
        if (m_context != INVALID_HANDLE_VALUE) ReleaseActCtx(m_context);
    }
    ManifestScope(const ManifestScope&) = delete;
    ManifestScope& operator=(const ManifestScope&) = delete;

  private:
    HANDLE m_context = INVALID_HANDLE_VALUE;
    ULONG_PTR m_cookie = 0;
    bool m_active = false;
};

}  // namespace velmora::support::win32
