#include "programs/reelview/window/stored_state_win32.h"

#include <algorithm>
#include <string>
#include <utility>
#include <vector>

namespace velmora::reelview {
namespace {

constexpr wchar_t kKey[] = L"Software\\Velmora\\Reel View";
constexpr wchar_t kRecent[] = L"Recent Files", kPlace[] = L"Window Place";

void Store(const wchar_t* name, DWORD type, const void* bytes, std::size_t size) {
    RegSetKeyValueW(HKEY_CURRENT_USER, kKey, name, type, bytes, static_cast<DWORD>(size));
}

}  // namespace

RecentFiles StoredRecentFiles() {
    DWORD size = 0;
    RegGetValueW(HKEY_CURRENT_USER, kKey, kRecent, RRF_RT_REG_MULTI_SZ, nullptr, nullptr, &size);
    std::wstring text(size / sizeof(wchar_t), L'\0');
    if (RegGetValueW(HKEY_CURRENT_USER, kKey, kRecent, RRF_RT_REG_MULTI_SZ, nullptr, text.data(), &size) !=
        ERROR_SUCCESS) {
        return {};
    }
    text.resize(size / sizeof(wchar_t));
    std::vector<std::u16string> files;
    for (std::size_t start = 0; start < text.size() && text[start] != 0;) {
        const std::size_t end = std::min(text.find(L'\0', start), text.size());
        files.emplace_back(text.begin() + static_cast<std::ptrdiff_t>(start),
                           text.begin() + static_cast<std::ptrdiff_t>(end));
        start = end + 1;
    }
    return RecentFiles(std::move(files));
}

void StoreRecentFiles(const RecentFiles& files) {
    std::wstring text;
    for (const std::u16string& file : files.Files()) {
        text.append(file.begin(), file.end());
        text += L'\0';
    }
    text += L'\0';
    Store(kRecent, REG_MULTI_SZ, text.data(), text.size() * sizeof(wchar_t));
}

std::optional<WINDOWPLACEMENT> StoredPlace() {
    WINDOWPLACEMENT place = {};
    DWORD size = sizeof place;
    if (RegGetValueW(HKEY_CURRENT_USER, kKey, kPlace, RRF_RT_REG_BINARY, nullptr, &place, &size) !=
        ERROR_SUCCESS) {
        return std::nullopt;
    }
    const RECT& box = place.rcNormalPosition;
    const bool isSound = size == sizeof place && place.length == sizeof place && box.right > box.left &&
                         box.bottom > box.top && MonitorFromRect(&box, MONITOR_DEFAULTTONULL) != nullptr;
    if (!isSound) return std::nullopt;
    if (place.showCmd != SW_SHOWMAXIMIZED) place.showCmd = SW_SHOWNORMAL;
    return place;
}

void StorePlace(HWND window) {
    WINDOWPLACEMENT place = {};
    place.length = sizeof place;
    if (GetWindowPlacement(window, &place)) Store(kPlace, REG_BINARY, &place, sizeof place);
}

}  // namespace velmora::reelview
