// Connects window procedures to C++ objects, and pixels to the screen. Windows only.
#pragma once

#include <windows.h>

#include "programs/reelview/base/picture.h"

namespace velmora::reelview {

// Binds an object to a window: the object is the creation parameter and is unbound when the window is destroyed.
// `Object` has LRESULT OnMessage(UINT, WPARAM, LPARAM) and HWND m_window.
template <class Object>
LRESULT CALLBACK ObjectProcedure(HWND window, UINT message, WPARAM wParam, LPARAM lParam) {
    if (message == WM_NCCREATE) {
        auto* const create = reinterpret_cast<CREATESTRUCTW*>(lParam);
        auto* const object = static_cast<Object*>(create->lpCreateParams);
        object->m_window = window;
        SetWindowLongPtrW(window, GWLP_USERDATA, reinterpret_cast<LONG_PTR>(object));
    }
    auto* const object = reinterpret_cast<Object*>(GetWindowLongPtrW(window, GWLP_USERDATA));
    if (object == nullptr) return DefWindowProcW(window, message, wParam, lParam);
    if (message == WM_NCDESTROY) {
        SetWindowLongPtrW(window, GWLP_USERDATA, 0);
        object->m_window = nullptr;
        return DefWindowProcW(window, message, wParam, lParam);
    }
    return object->OnMessage(message, wParam, lParam);
}

template <class Object>
void RegisterObjectClass(const wchar_t* name, UINT style) {
    WNDCLASSEXW description = {};
    description.cbSize = sizeof description;
    description.style = style;
    description.lpfnWndProc = ObjectProcedure<Object>;
    description.hInstance = GetModuleHandleW(nullptr);
    description.hCursor = LoadCursorW(nullptr, IDC_ARROW);
    description.lpszClassName = name;
    RegisterClassExW(&description);  // fails harmlessly when the class is already registered
}

inline BITMAPINFO BitmapInfoOf(hosts::FrameSize size) {
    BITMAPINFO info = {};
    info.bmiHeader.biSize = sizeof info.bmiHeader;
    info.bmiHeader.biWidth = size.width;
    info.bmiHeader.biHeight = -size.height;  // top-down
    info.bmiHeader.biPlanes = 1;
    info.bmiHeader.biBitCount = 32;
    info.bmiHeader.biCompression = BI_RGB;
    return info;
}

inline void DrawPicture(HDC dc, const Picture& picture, int x, int y) {
    const BITMAPINFO info = BitmapInfoOf(picture.size);
    SetDIBitsToDevice(dc, x, y, static_cast<DWORD>(picture.size.width),
                      static_cast<DWORD>(picture.size.height), 0, 0, 0,
                      static_cast<UINT>(picture.size.height), picture.pixels.data(), &info, DIB_RGB_COLORS);
}

// Paints into memory first to avoid flicker; the result appears on destruction.
class BufferedPaint {
  public:
    BufferedPaint(HDC target, const RECT& area)
        : m_target(target),
          m_area(area),
          m_dc(CreateCompatibleDC(target)),
          m_bitmap(CreateCompatibleBitmap(target, area.right - area.left, area.bottom - area.top)),
          m_before(SelectObject(m_dc, m_bitmap)) {
        SetWindowOrgEx(m_dc, area.left, area.top, nullptr);
    }
    ~BufferedPaint() {
        BitBlt(m_target, m_area.left, m_area.top, m_area.right - m_area.left, m_area.bottom - m_area.top,
               m_dc, m_area.left, m_area.top, SRCCOPY);
        SelectObject(m_dc, m_before);
        DeleteObject(m_bitmap);
        DeleteDC(m_dc);
    }
    BufferedPaint(const BufferedPaint&) = delete;
    BufferedPaint& operator=(const BufferedPaint&) = delete;
    [[nodiscard]] HDC Dc() const { return m_dc; }

  private:
    HDC m_target;
    RECT m_area;
    HDC m_dc;
    HBITMAP m_bitmap;
    HGDIOBJ m_before;
};

}  // namespace velmora::reelview
