// Opens the help file at a numbered topic, either in the system's help viewer (a separate program) or through the HTML
// help control inside this process. Windows only; the user-interface thread.
#pragma once

#include <cstdint>
#include <string>

namespace velmora::support {

class HelpLauncher {
  public:
    // `folder` is 16-bit text that ends in a separator, `fileName` 8-bit text in the system code page.
    void SetFile(std::u16string folder, const std::string& fileName);

    // Non-zero when the help was started. `owner` is a window handle or null.
    [[nodiscard]] std::int32_t Show(void* owner, std::int32_t topic, bool externalViewer) const;

  private:
    [[nodiscard]] std::int32_t ShowInViewer(void* owner, std::int32_t topic) const;
    [[nodiscard]] std::int32_t ShowInProcess(void* owner, std::int32_t topic) const;

    std::u16string m_path;
};

}  // namespace velmora::support
