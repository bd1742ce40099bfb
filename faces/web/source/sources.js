import {clipSeconds, unknownFacts} from './clip_time.js';

// Where pictures come from. Every source has
//   kind         'still', 'clip' or 'camera'
//   name         of the file, for the files and commands that are made from it
//   file         what a clip was opened from
//   width, height, duration (seconds; Infinity for a camera), frameRate (text, or '' when it is not known)
//   seconds      the clip time that is shown
//   isPlaying, play(), pause(), seek(seconds), close()
//   picture()    a promise of the picture of now, to be given away
//   onFrame      called when another picture or time is to be shown; onState when it starts, stops or ends

const stillSeconds = 10;
const stillRate = 30;
const mostPixels = 64e6;  // of a picture; the effects hold it twice
export const tooLarge = 'This picture is too large. The page shows pictures of up to 64 million pixels.';

class Source {
    onFrame = () => {};
    onState = () => {};
    frameRate = '';
    file = null;
}

// A picture runs as a film of ten seconds, again and again: the effects move on it.
class Still extends Source {
    kind = 'still';
    duration = stillSeconds;
    frameRate = String(stillRate);
    isPlaying = false;
    isUnchanging = true;
    #bitmap;
    #frame = 0;
    #timer = 0;

    constructor(bitmap, name) {
        super();
        this.#bitmap = bitmap;
        this.name = name;
        this.width = bitmap.width;
        this.height = bitmap.height;
    }
    get seconds() {
        return this.#frame / stillRate;
    }
    play() {
        if (this.isPlaying) return;
        this.isPlaying = true;
        const begin = performance.now() - this.seconds * 1000;
        const step = () => {
            const frame = Math.floor((performance.now() - begin) / 1000 * stillRate) % (stillSeconds * stillRate);
            if (frame !== this.#frame) {
                this.#frame = frame;
                this.onFrame();
            }
            this.#timer = requestAnimationFrame(step);
        };
        this.#timer = requestAnimationFrame(step);
        this.onState();
    }
    pause() {
        this.isPlaying = false;
        cancelAnimationFrame(this.#timer);
        this.onState();
    }
    seek(seconds) {
        const wasPlaying = this.isPlaying;
        if (wasPlaying) this.pause();
        this.#frame = Math.min(Math.max(Math.round(seconds * stillRate), 0), stillSeconds * stillRate - 1);
        this.onFrame();
        if (wasPlaying) this.play();
    }
    picture() {
        return createImageBitmap(this.#bitmap);
    }
    close() {
        this.pause();
        this.#bitmap.close();
    }
}

// What a <video> shows: a clip or the camera.
class Video extends Source {
    #video;
    #time = 0;
    #facts = unknownFacts;

    constructor(video, kind, name) {
        super();
        this.#video = video;
        this.kind = kind;
        this.name = name;
        this.width = video.videoWidth;
        this.height = video.videoHeight;
        this.duration = video.duration;
        video.onplay = video.onpause = () => this.onState();
        this.#watch();
    }
    // Frames as they are presented; a browser without that shows them as time goes by.
    #watch() {
        const video = this.#video;
        const isWatched = 'requestVideoFrameCallback' in video;
        const next = (now, metadata) => {
            if (this.#video === null) return;
            this.#time = metadata?.mediaTime ?? video.currentTime;
            this.onFrame();
            if (isWatched) video.requestVideoFrameCallback(next);
            else if (!video.paused) requestAnimationFrame(next);
        };
        if (isWatched) {
            video.requestVideoFrameCallback(next);
        } else {
            video.onplaying = next;
            video.onseeked = () => next();
        }
    }
    // Known once the file has been looked into: clip times count from its first frame.
    setFacts(facts) {
        this.frameRate = facts.frameRate;
        this.#facts = facts;
        this.onFrame();
    }
    get isPlaying() {
        return !this.#video.paused;
    }
    get seconds() {
        return clipSeconds(this.#time, this.#facts);
    }
    play() {
        return this.#video.play().catch(() => {});
    }
    pause() {
        this.#video.pause();
    }
    seek(seconds) {
        this.#video.currentTime = Math.min(Math.max(seconds, 0), Math.max(0, this.duration - 0.001));
    }
    picture() {
        if ('VideoFrame' in window) {
            try {
                const frame = new VideoFrame(this.#video);
                const isUpright = frame.displayWidth === this.width && frame.displayHeight === this.height &&
                    !frame.rotation && !frame.flip;
                if (isUpright) return Promise.resolve(frame);
                frame.close();
            } catch {
                // The bitmap below says what is wrong.
            }
        }
        return createImageBitmap(this.#video);
    }
    close() {
        const video = this.#video;
        this.#video = null;
        video.onplay = video.onpause = null;
        video.pause();
        for (const track of video.srcObject?.getTracks() ?? []) track.stop();
        if (video.src) URL.revokeObjectURL(video.src);
        video.removeAttribute('src');
        video.srcObject = null;
    }
}

function newVideo() {
    const video = document.createElement('video');
    video.playsInline = true;
    video.loop = true;
    video.preload = 'auto';
    return video;
}

function loaded(video) {
    return new Promise((resolve, reject) => {
        video.onloadeddata = resolve;
        video.onerror = () => reject(new Error('no picture'));
    });
}

async function openClip(file) {
    const video = newVideo();
    const isLoaded = loaded(video);
    video.src = URL.createObjectURL(file);
    await isLoaded;
    // A file with sound alone has no picture; a stream may not say how long it is.
    if (video.videoWidth === 0 || !Number.isFinite(video.duration)) throw new Error('no picture');
    const source = new Video(video, 'clip', file.name);
    source.file = file;
    return source;
}

export async function openFile(file) {
    if (file.size === 0) throw new Error('no picture');
    if (file.type.startsWith('video/') || file.type.startsWith('audio/')) return openClip(file);
    let bitmap;
    try {
        bitmap = await createImageBitmap(file);
    } catch {
        return openClip(file);
    }
    if (bitmap.width * bitmap.height > mostPixels) {
        bitmap.close();
        throw new Error(tooLarge);
    }
    return new Still(bitmap, file.name);
}

export async function openCamera() {
    const stream = await navigator.mediaDevices.getUserMedia({video: {width: {ideal: 1280}}, audio: false});
    const video = newVideo();
    const isLoaded = loaded(video);
    video.srcObject = stream;
    video.muted = true;
    await isLoaded;
    return new Video(video, 'camera', 'camera.mp4');
}

// A picture of the page itself, given as a data: address.
export async function openPicture(address, name) {
    const image = new Image();
    image.src = address;
    await image.decode();
    return new Still(await createImageBitmap(image), name);
}
