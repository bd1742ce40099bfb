// The thread that renders. It owns the page's two canvases, the plain picture and the one with the effect, and draws
// the thumbnails and the pictures that are kept. Requests are answered in their order; thumbnails give way to the rest.
import {loadEngine} from './engine.js';

const thumbnailWidth = 320;

let engine, stage, thumbnails, exported;

// Pixels of a picture (ImageBitmap, VideoFrame) at a size.
class PixelReader {
    #canvas = new OffscreenCanvas(1, 1);
    #context = this.#canvas.getContext('2d', {willReadFrequently: true});

    read(picture, width, height) {
        if (this.#canvas.width !== width || this.#canvas.height !== height) {
            this.#canvas.width = width;
            this.#canvas.height = height;
        }
        this.#context.drawImage(picture, 0, 0, width, height);
        return this.#context.getImageData(0, 0, width, height);
    }
}

const reader = new PixelReader();

class Stage {
    #result;
    #plain;
    #picture = engine.newPicture();

    constructor(result, plain) {
        this.#result = result.getContext('2d');
        this.#plain = plain.getContext('2d');
    }

    setPicture(picture, width, height) {
        const pixels = reader.read(picture, width, height);
        this.#picture.set(pixels);
        for (const {canvas} of [this.#result, this.#plain]) {
            if (canvas.width === width && canvas.height === height) continue;
            canvas.width = width;
            canvas.height = height;
        }
        this.#plain.putImageData(pixels, 0, 0);
    }

    draw(look, seconds) {
        if (this.#picture.width === 0) return;
        const {width, height} = this.#picture;
        const pixels = engine.render(this.#picture, look, seconds);
        this.#result.putImageData(new ImageData(pixels, width, height), 0, 0);
    }

    png() {
        return this.#result.canvas.convertToBlob({type: 'image/png'});
    }
}

class Thumbnails {
    #picture = engine.newPicture();
    #jobs = [];
    #next = new MessageChannel();
    #canvas = new OffscreenCanvas(1, 1);

    constructor() {
        this.#next.port1.onmessage = () => this.#drawNext();
    }

    // Replaces what is still to be drawn: [{id, look}].
    draw(picture, jobs, seconds) {
        const [wide, high] = [picture.displayWidth ?? picture.width, picture.displayHeight ?? picture.height];
        const height = Math.max(1, Math.round(thumbnailWidth * high / wide));
        this.#picture.set(reader.read(picture, thumbnailWidth, height));
        this.#canvas.width = thumbnailWidth;
        this.#canvas.height = height;
        const isIdle = this.#jobs.length === 0;
        this.#jobs = jobs.map((job) => ({...job, seconds}));
        if (isIdle) this.#next.port2.postMessage(null);
    }

    // One a turn, so that a frame of the stage waits for one thumbnail at most.
    #drawNext() {
        const job = this.#jobs.shift();
        if (!job) return;
        const {width, height} = this.#picture;
        const pixels = engine.render(this.#picture, job.look, job.seconds);
        this.#canvas.getContext('2d').putImageData(new ImageData(pixels, width, height), 0, 0);
        const bitmap = this.#canvas.transferToImageBitmap();
        postMessage({type: 'thumbnail', id: job.id, bitmap}, [bitmap]);
        if (this.#jobs.length > 0) this.#next.port2.postMessage(null);
    }
}

// A rendered picture of its own, for a clip that is written: at full size and without the stage.
function develop(picture, {width, height, look, seconds, timestamp, duration}) {
    exported ??= engine.newPicture();
    exported.set(reader.read(picture, width, height));
    engine.render(exported, look, seconds);
    return new VideoFrame(engine.planes(exported), {
        format: 'I420', codedWidth: width, codedHeight: height, timestamp, duration: duration || undefined,
        colorSpace: {primaries: 'bt709', transfer: 'bt709', matrix: 'bt709', fullRange: false},
    });
}

const requests = {
    async start({wasm, result, plain}) {
        engine = await loadEngine(wasm);
        stage = new Stage(result, plain);
        thumbnails = new Thumbnails();
        return {effects: engine.describe()};
    },
    // Draws a new picture, or the last one once more.
    frame({picture, width, height, look, seconds}) {
        const begin = performance.now();
        if (picture) stage.setPicture(picture, width, height);
        picture?.close();
        const read = performance.now();
        stage.draw(look, seconds);
        return {readTime: read - begin, time: performance.now() - begin};
    },
    thumbnails({picture, jobs, seconds}) {
        thumbnails.draw(picture, jobs, seconds);
        picture.close();
        return {};
    },
    async png() {
        return {blob: await stage.png()};
    },
    develop(request) {
        const frame = develop(request.picture, request);
        request.picture.close();
        return {frame};
    },
};

let last = Promise.resolve();

onmessage = ({data}) => {
    last = last.then(async () => {
        try {
            const answer = await requests[data.type](data);
            postMessage({type: 'answer', id: data.id, ...answer}, answer.frame ? [answer.frame] : []);
        } catch (error) {
            data.picture?.close();
            postMessage({type: 'answer', id: data.id, error: String(error?.message ?? error)});
        }
    });
};
