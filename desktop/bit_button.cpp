#include "desktop/bit_button.h"

#include <windowsx.h>

#include <algorithm>
#include <memory>
#include <new>

#include "platform/win32.h"

namespace velmora::support {
namespace {

constexpr SIZE kSizeWithoutBitmap = {74, 32};
constexpr int kImages = 3;
constexpr int kPlainMargin = 8;  // how much lower than the bitmap button the standard button is
constexpr int kPlainLowest = 10;
constexpr int kWindowExtraBytes = sizeof(void*);  // a pointer to the window's record

// The background colour of dialogs.
HBRUSH DialogBrush() noexcept {
    return GetSysColorBrush(COLOR_3DFACE);
}

class BitButton {
  public:
    explicit BitButton(const BitButtonDescription& description) noexcept
        : m_owner(description.owner),
          m_command(description.command),
          m_bitmap(description.bitmap),
          m_plain(description.plain),
          m_state(description.notify) {}

    // Called once the window exists and has its size.
    void Attach(HWND window) noexcept {
        m_window = window;
        GetClientRect(window, &m_client);
        if (m_plain) CreatePlainButton();
    }

    LRESULT OnMessage(HWND window, UINT message, WPARAM wParam, LPARAM lParam) noexcept;

  private:
    void CreatePlainButton() noexcept;
    void Perform(const BitButtonReaction& reaction) noexcept;
    void TellOwner() const noexcept;
    void Paint() noexcept;
    void PaintImage(HDC dc) const noexcept;
    [[nodiscard]] bool OnMouse(UINT message, LPARAM lParam) noexcept;

    HWND m_owner;
    WORD m_command;
    HBITMAP m_bitmap;
    RECT m_client = {};
    HWND m_window = nullptr;
    bool m_plain;
    BitButtonState m_state;
    HWND m_plainButton = nullptr;
};

void BitButton::CreatePlainButton() noexcept {
    const int height = std::max(static_cast<int>(m_client.bottom) - kPlainMargin, kPlainLowest);
    const int top = (static_cast<int>(m_client.bottom) - height) / 2;
    m_plainButton = CreateWindowExW(0, L"BUTTON", L"", WS_CHILD | WS_VISIBLE, 0, top, m_client.right, height,
                                    m_window, reinterpret_cast<HMENU>(static_cast<UINT_PTR>(m_command)),
                                    GetWindowInstance(m_window), nullptr);
    if (m_plainButton != nullptr) SetWindowFont(m_plainButton, GetStockFont(DEFAULT_GUI_FONT), TRUE);
}

void BitButton::TellOwner() const noexcept {
    PostMessageW(m_owner, WM_COMMAND, MAKEWPARAM(m_command, BN_CLICKED), reinterpret_cast<LPARAM>(m_window));
}

void BitButton::Perform(const BitButtonReaction& reaction) noexcept {
    if (reaction.click) TellOwner();
    if (reaction.trackLeave) {
        TRACKMOUSEEVENT track = {sizeof track, TME_LEAVE, m_window, 0};
        TrackMouseEvent(&track);
    }
    if (reaction.captureMouse) SetCapture(m_window);
    if (reaction.releaseCapture) ReleaseCapture();
    if (reaction.redraw) InvalidateRect(m_window, nullptr, FALSE);
}

void BitButton::PaintImage(HDC dc) const noexcept {
    const win32::MemoryDc memory(CreateCompatibleDC(dc));
    if (memory == nullptr) return;
    const win32::Selection selected(memory.get(), m_bitmap);
    const BLENDFUNCTION overDialog = {AC_SRC_OVER, 0, 255, AC_SRC_ALPHA};
    const int width = m_client.right;
    const int height = m_client.bottom;
    AlphaBlend(dc, 0, 0, width, height, memory.get(), 0, m_state.ImageIndex() * height, width, height,
               overDialog);
}

void BitButton::Paint() noexcept {
    const win32::Painting painting(m_window);
    FillRect(painting.Dc(), &m_client, DialogBrush());
    if (!m_plain && m_bitmap != nullptr) PaintImage(painting.Dc());
}

bool BitButton::OnMouse(UINT message, LPARAM lParam) noexcept {
    switch (message) {
        case WM_MOUSEMOVE: {
            const POINT pointer = {GET_X_LPARAM(lParam), GET_Y_LPARAM(lParam)};
            Perform(m_state.OnMouseMove(PtInRect(&m_client, pointer) != FALSE));
            return true;
        }
        case WM_LBUTTONDOWN:
            Perform(m_state.OnButtonDown());
            return true;
        case WM_LBUTTONUP:
            Perform(m_state.OnButtonUp());
            return true;
        case WM_MOUSELEAVE:
            Perform(m_state.OnMouseLeave());
            return true;
        case WM_CAPTURECHANGED:
            Perform(m_state.OnCaptureChanged());
            return true;
        default:
            return false;
    }
}

LRESULT BitButton::OnMessage(HWND window, UINT message, WPARAM wParam, LPARAM lParam) noexcept {
    switch (message) {
        case WM_ERASEBKGND:
            return TRUE;  // painting fills the whole button
        case WM_PAINT:
            Paint();
            return 0;
        case WM_SIZE:
            GetClientRect(window, &m_client);
            break;
        case WM_COMMAND:
            if (m_plain && m_state.Notifies()) TellOwner();
            return 0;
        default:
            if (!m_plain && OnMouse(message, lParam)) return 0;
    }
    return DefWindowProcW(window, message, wParam, lParam);
}

BitButton* ButtonOf(HWND window) noexcept {
    return reinterpret_cast<BitButton*>(GetWindowLongPtrW(window, 0));
}

LRESULT CALLBACK BitButtonProcedure(HWND window, UINT message, WPARAM wParam, LPARAM lParam) noexcept {
    BitButton* button = ButtonOf(window);
    if (button == nullptr) return DefWindowProcW(window, message, wParam, lParam);
    if (message == WM_NCDESTROY) {
        SetWindowLongPtrW(window, 0, 0);
        delete button;
        return DefWindowProcW(window, message, wParam, lParam);
    }
    return button->OnMessage(window, message, wParam, lParam);
}

}  // namespace

bool RegisterBitButtonClass(HMODULE module) noexcept {
    WNDCLASSW description = {};
    description.style = CS_HREDRAW | CS_VREDRAW;
    description.lpfnWndProc = BitButtonProcedure;
    description.cbWndExtra = kWindowExtraBytes;
    description.hInstance = module;
    description.hCursor = LoadCursorW(nullptr, IDC_ARROW);
    description.hbrBackground = reinterpret_cast<HBRUSH>(COLOR_3DFACE);  // 15; never seen: painting fills
    description.lpszClassName = kBitButtonClass;
    return RegisterClassW(&description) != 0;
}

bool UnregisterBitButtonClass(HMODULE module) noexcept {
    return UnregisterClassW(kBitButtonClass, module) != FALSE;
}

SIZE BitButtonSize(HBITMAP bitmap) noexcept {
    BITMAP size = {};
    if (bitmap == nullptr || GetObjectW(bitmap, sizeof size, &size) == 0) return kSizeWithoutBitmap;
    return {size.bmWidth, size.bmHeight / kImages};
}

HWND CreateBitButton(const BitButtonDescription& description) noexcept {
    std::unique_ptr<BitButton> button(new (std::nothrow) BitButton(description));
    if (button == nullptr) return nullptr;
    const SIZE size = BitButtonSize(description.bitmap);
    const HWND window = CreateWindowExW(
        WS_EX_NOPARENTNOTIFY, kBitButtonClass, L"", WS_CHILD | WS_VISIBLE, description.position.x,
        description.position.y, size.cx, size.cy, description.owner,
        reinterpret_cast<HMENU>(static_cast<UINT_PTR>(description.command)), description.module, nullptr);
    if (window == nullptr) return nullptr;
    button->Attach(window);
    // From here the window owns its record.
    SetWindowLongPtrW(window, 0, reinterpret_cast<LONG_PTR>(button.release()));
    return window;
}

}  // namespace velmora::support
