// What all code on the media libraries uses: owners of their objects, and their errors and messages as text.
#pragma once

#include <cerrno>
#include <memory>
#include <new>
#include <string>

extern "C" {
#include <libavcodec/avcodec.h>
#include <libavformat/avformat.h>
#include <libavutil/buffer.h>
#include <libavutil/frame.h>
#include <libavutil/mem.h>
#include <libswresample/swresample.h>
#include <libswscale/swscale.h>
}

namespace velmora::hosts {

struct AvDelete {
    void operator()(AVFrame* frame) const { av_frame_free(&frame); }
    void operator()(AVPacket* packet) const { av_packet_free(&packet); }
    void operator()(AVCodecContext* codec) const { avcodec_free_context(&codec); }
    void operator()(SwsContext* scaler) const { sws_freeContext(scaler); }
    void operator()(SwrContext* resampler) const { swr_free(&resampler); }
    void operator()(AVBufferPool* pool) const {
        av_buffer_pool_uninit(&pool);
    }  // after the last buffer's return
};
using FramePtr = std::unique_ptr<AVFrame, AvDelete>;
using PacketPtr = std::unique_ptr<AVPacket, AvDelete>;
using CodecPtr = std::unique_ptr<AVCodecContext, AvDelete>;
using ScalerPtr = std::unique_ptr<SwsContext, AvDelete>;
using BufferPoolPtr = std::unique_ptr<AVBufferPool, AvDelete>;
using ResamplerPtr = std::unique_ptr<SwrContext, AvDelete>;

// Throws std::bad_alloc for null: the libraries' allocators fail for no other reason.
template <class Owner>
Owner Allocated(typename Owner::pointer object) {
    if (!object) throw std::bad_alloc();
    return Owner(object);
}

inline FramePtr NewFrame() {
    return Allocated<FramePtr>(av_frame_alloc());
}
inline PacketPtr NewPacket() {
    return Allocated<PacketPtr>(av_packet_alloc());
}

inline std::string AvText(int error) {
    char text[AV_ERROR_MAX_STRING_SIZE] = {};
    av_strerror(error, text, sizeof text);
    return text;
}

// Where a library reports an error among others: that memory is short, or a thread cannot start, is no fault of
// input or output. Some say only that something went wrong.
inline void ThrowIfNoMemory(int error) {
    constexpr std::size_t kWorkingMemory = std::size_t{64} << 20;
    const auto isEnough = [] {
        void* const block = av_malloc(kWorkingMemory);
        av_free(block);
        return block != nullptr;
    };
    const bool isShort = error == AVERROR(ENOMEM) || error == AVERROR(EAGAIN);
    if (isShort || (error == AVERROR_EXTERNAL && !isEnough())) throw std::bad_alloc();
}

// A dictionary of options; what a call did not take stays in it.
class AvOptions {
  public:
    AvOptions() = default;
    ~AvOptions() { av_dict_free(&m_entries); }
    AvOptions(const AvOptions&) = delete;
    AvOptions& operator=(const AvOptions&) = delete;

    void Set(const char* name, const std::string& value) { av_dict_set(&m_entries, name, value.c_str(), 0); }
    AVDictionary** Entries() { return &m_entries; }

  private:
    AVDictionary* m_entries = nullptr;
};

// What the media libraries say (library_log.cpp): nothing goes to standard error by itself, and their last words make
// messages plainer.

// From now on the libraries' messages are kept instead of written.
void KeepLibraryLog();

// Drops the kept messages, so that they are not given as the reason of a later error.
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
