// What the media libraries say: nothing goes to standard error by itself, and their last words make messages plainer.
#pragma once

#include <string>

namespace velmora::hosts {

// From now on the libraries' messages are kept instead of written.
void KeepLibraryLog();

// What was said so far is not about what follows.
void ForgetLibraryErrors();

// ": " and the library's own last words on an error if there are any, otherwise the error's name.
std::string ErrorWords(int error);

// Some encoders write to standard error by themselves. While this object lives, what is written there is kept.
class StandardErrorCapture {
  public:
    StandardErrorCapture();
    ~StandardErrorCapture();
    StandardErrorCapture(const StandardErrorCapture&) = delete;
    StandardErrorCapture& operator=(const StandardErrorCapture&) = delete;

    // The first warning so far; empty if there is none.
    [[nodiscard]] std::string Warning() const;

  private:
    int m_kept = -1, m_file = -1;
};

}  // namespace velmora::hosts
