// The effects in WebAssembly. One engine runs in one thread and renders one picture at a time.

const shared = new DataView(new ArrayBuffer(4));

// A slider's value word holds a 32-bit number.
export function bitsOfNumber(number) {
    shared.setFloat32(0, number);
    return shared.getUint32(0);
}

export function numberOfBits(bits) {
    shared.setUint32(0, bits);
    return shared.getFloat32(0);
}

// What the module asks of its surroundings: there is no environment and nothing to exit from.
function imports(memory) {
    return {
        env: {emscripten_notify_memory_growth() {}},
        wasi_snapshot_preview1: {
            environ_sizes_get(count, bytes) {
                const view = new DataView(memory().buffer);
                view.setUint32(count, 0, true);
                view.setUint32(bytes, 0, true);
                return 0;
            },
            environ_get: () => 0,
            proc_exit() {
                throw new Error('the effects have stopped');
            },
        },
    };
}

export async function loadEngine(bytes) {
    let calls = null;
    const {instance} = await WebAssembly.instantiate(bytes, imports(() => calls.memory));
    calls = instance.exports;
    calls._initialize();
    return new Engine(calls);
}

class Engine {
    #calls;
    #sessions = [];

    constructor(calls) {
        this.#calls = calls;
    }

    // The effects' tables, as faces/web/effect_page.h has them.
    describe() {
        const bytes = new Uint8Array(this.#calls.memory.buffer, this.#calls.DescribeEffects());
        return JSON.parse(new TextDecoder().decode(bytes.subarray(0, bytes.indexOf(0))));
    }

    newPicture() {
        return new EnginePicture(this.#calls);
    }

    // Renders a picture with a look {effect, values, seed}, values as words, and returns the pixels as a canvas has
    // them: a view that holds until the next call.
    render(picture, look, seconds) {
        const session = this.#session(look.effect);
        look.values.forEach((bits, parameter) => this.#calls.SetValue(session, parameter, bits));
        this.#calls.SetSeed(session, look.seed);
        const {source, target, width, height} = picture.places();
        if (!this.#calls.RenderFrame(session, source, target, width, height, seconds)) {
            throw new Error('the picture cannot be rendered');
        }
        return new Uint8ClampedArray(this.#calls.memory.buffer, target, width * height * 4);
    }

    // The last result of a picture as an encoder takes it: planes of I420, BT.709, to keep.
    planes(picture) {
        const {source, target, width, height} = picture.places();
        // What the source was is not needed any more.
        this.#calls.ToPlanes(target, source, width, height);
        const size = width * height + 2 * ((width + 1) >> 1) * ((height + 1) >> 1);
        return new Uint8Array(this.#calls.memory.buffer, source, size).slice();
    }

    #session(effect) {
        this.#sessions[effect] ??= this.#calls.NewSession(effect);
        if (!this.#sessions[effect]) throw new Error('not enough memory');
        return this.#sessions[effect];
    }
}

// A source picture and its result in the engine's memory.
class EnginePicture {
    #calls;
    #source = 0;
    #target = 0;
    #capacity = 0;
    width = 0;
    height = 0;

    constructor(calls) {
        this.#calls = calls;
    }

    // Takes the pixels of an ImageData.
    set({data, width, height}) {
        this.#reserve(data.length);
        new Uint8ClampedArray(this.#calls.memory.buffer, this.#source, data.length).set(data);
        this.#calls.SwapRedAndBlue(this.#source, width * height);
        this.width = width;
        this.height = height;
    }

    places() {
        return {source: this.#source, target: this.#target, width: this.width, height: this.height};
    }

    #reserve(bytes) {
        if (bytes <= this.#capacity) return;
        this.#calls.FreePixels(this.#source);
        this.#calls.FreePixels(this.#target);
        this.#source = this.#calls.NewPixels(bytes);
        this.#target = this.#calls.NewPixels(bytes);
        this.#capacity = this.#source && this.#target ? bytes : 0;
        if (this.#capacity === 0) throw new Error('not enough memory');
    }
}
