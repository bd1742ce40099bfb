// Brings the source's pictures to the renderer, one at a time and always the newest, and the look with them.

// So many frames in a row that take too long make the picture half its size while it plays; so many that would not take
// too long at full size, four times the pixels, make it full again. Times in milliseconds.
const framesInRow = 12;
const slowTime = 38;
const fastTime = 7;

export class Player {
    #renderer;
    #looks;
    #source = null;
    #isDrawing = false;
    #wantsDraw = false;
    #wantsPicture = false;
    #scale = 1;
    #inRow = 0;
    #shown = [];
    #idle = [];
    onShown = () => {};
    onFailure = () => {};

    constructor(renderer, looks) {
        this.#renderer = renderer;
        this.#looks = looks;
    }

    get source() {
        return this.#source;
    }
    get isHalfSize() {
        return this.#scale < 1;
    }
    // Frames of the last second.
    get frameRate() {
        const since = performance.now() - 1000;
        this.#shown = this.#shown.filter((time) => time > since);
        return this.#shown.length;
    }

    setSource(source) {
        this.#source?.close();
        this.#source = source;
        this.#scale = 1;
        source.onFrame = () => this.draw(!source.isUnchanging);
        source.onState = () => {
            if (!source.isPlaying) this.#rest();
            this.onShown();
        };
        this.draw(true);
    }

    // Shows the present look, with a new picture or the last one.
    draw(withPicture = false) {
        this.#wantsDraw = true;
        this.#wantsPicture ||= withPicture;
        if (!this.#isDrawing && this.#source) this.#drawAll();
    }

    // Resolves when everything asked for so far is shown.
    settled() {
        if (!this.#isDrawing && !this.#wantsDraw) return Promise.resolve();
        return new Promise((resolve) => this.#idle.push(resolve));
    }

    // Full size again.
    #rest() {
        if (this.#scale === 1) return;
        this.#scale = 1;
        this.draw(true);
    }

    async #drawAll() {
        this.#isDrawing = true;
        while (this.#wantsDraw) {
            const withPicture = this.#wantsPicture;
            this.#wantsDraw = this.#wantsPicture = false;
            try {
                await this.#drawOne(withPicture);
            } catch (error) {
                this.onFailure(error);
            }
        }
        this.#isDrawing = false;
        for (const resolve of this.#idle.splice(0)) resolve();
    }

    async #drawOne(withPicture) {
        const source = this.#source;
        const begin = performance.now();
        const seconds = source.seconds;
        const picture = withPicture ? await source.picture() : null;
        await this.#renderer.frame({
            picture, seconds, look: this.#looks.rendered,
            width: Math.max(1, Math.round(source.width * this.#scale)),
            height: Math.max(1, Math.round(source.height * this.#scale)),
        });
        this.#shown.push(performance.now());
        this.#watchTime(performance.now() - begin);
        this.onShown();
    }

    #watchTime(time) {
        const isHalf = this.isHalfSize;
        const isOtherSizeBetter = this.#source.isPlaying && (isHalf ? time < fastTime : time > slowTime);
        this.#inRow = isOtherSizeBetter ? this.#inRow + 1 : 0;
        if (this.#inRow < framesInRow) return;
        this.#inRow = 0;
        this.#scale = isHalf ? 1 : 0.5;
        this.draw(true);
    }
}
