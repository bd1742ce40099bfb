// The forms in which a pixel kernel exists. The plain form is the authority; the others give its bytes.
#pragma once

namespace velmora::render {

enum class Form { kPlain, kSse2, kAvx2 };

// The fastest form that this processor and operating system can run.
[[nodiscard]] Form BestForm() noexcept;

}  // namespace velmora::render
