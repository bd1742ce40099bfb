// The page's side of the rendering thread: requests as promises.

export class Renderer {
    #worker;
    #waiting = new Map();
    #lastId = 0;
    onThumbnail = () => {};

    // `script`: the worker's text. A worker from a file cannot be started from a page that is itself a file.
    constructor(script) {
        const address = URL.createObjectURL(new Blob([script], {type: 'text/javascript'}));
        this.#worker = new Worker(address);
        this.#worker.onmessage = ({data}) => {
            if (data.type === 'thumbnail') {
                this.onThumbnail(data.id, data.bitmap);
                return;
            }
            const {resolve, reject} = this.#waiting.get(data.id);
            this.#waiting.delete(data.id);
            if (data.error) reject(new Error(data.error));
            else resolve(data);
        };
        this.#worker.onerror = (event) => {
            for (const {reject} of this.#waiting.values()) reject(new Error(event.message));
            this.#waiting.clear();
        };
    }

    // Answers {effects}: the effects' tables.
    start(wasm, result, plain) {
        return this.#ask({type: 'start', wasm, result, plain}, [result, plain]);
    }

    // Draws `picture`, which is given away, or without one the last picture once more. Answers {time} in milliseconds.
    frame(request) {
        return this.#ask({type: 'frame', ...request}, request.picture ? [request.picture] : []);
    }

    thumbnails(picture, jobs, seconds) {
        return this.#ask({type: 'thumbnails', picture, jobs, seconds}, [picture]);
    }

    // Answers {blob} of the picture that is shown.
    png() {
        return this.#ask({type: 'png'}, []);
    }

    // Answers {frame}: a VideoFrame with the effect. The picture is given away.
    develop(request) {
        return this.#ask({type: 'develop', ...request}, [request.picture]);
    }

    #ask(request, transfer) {
        return new Promise((resolve, reject) => {
            const id = ++this.#lastId;
            this.#waiting.set(id, {resolve, reject});
            this.#worker.postMessage({...request, id}, transfer);
        });
    }
}
