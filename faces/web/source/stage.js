// The picture on the page: its size, the divider between before and after, full screen.

export class Stage {
    #stage;
    #frame;
    #divider;
    #ratio = 16 / 9;
    #share = 0.5;

    // `stage` is the place for the picture, `frame` the box with the two canvases, `divider` the handle in it.
    constructor(stage, frame, divider) {
        this.#stage = stage;
        this.#frame = frame;
        this.#divider = divider;
        new ResizeObserver(() => this.#fit()).observe(stage);
        frame.onpointerdown = (event) => this.#drag(event);
        divider.onkeydown = (event) => this.#key(event);
        this.setDivider(this.#share);
    }

    setSize(width, height) {
        this.#ratio = width / height;
        this.#fit();
    }

    // 0: all after, 1: all before.
    setDivider(share) {
        this.#share = Math.min(Math.max(share, 0), 1);
        const percent = `${(this.#share * 100).toFixed(2)}%`;
        this.#frame.style.setProperty('--divider', percent);
        this.#divider.setAttribute('aria-valuenow', Math.round(this.#share * 100));
    }

    toggleFullScreen(element) {
        if (document.fullscreenElement) return document.exitFullscreen();
        return element.requestFullscreen?.();
    }

    #fit() {
        const {clientWidth, clientHeight} = this.#stage;
        const width = Math.min(clientWidth, clientHeight * this.#ratio);
        this.#frame.style.width = `${Math.floor(width)}px`;
        this.#frame.style.height = `${Math.floor(width / this.#ratio)}px`;
    }

    #drag(event) {
        if (event.button !== 0) return;
        event.preventDefault();
        this.#divider.focus({preventScroll: true});
        this.#frame.setPointerCapture(event.pointerId);
        const move = ({clientX}) => {
            const {left, width} = this.#frame.getBoundingClientRect();
            this.setDivider((clientX - left) / width);
        };
        move(event);
        this.#frame.onpointermove = move;
        this.#frame.onpointerup = this.#frame.onpointercancel = () => { this.#frame.onpointermove = null; };
    }

    #key(event) {
        const step = event.shiftKey ? 0.1 : 0.02;
        const to = {ArrowLeft: this.#share - step, ArrowRight: this.#share + step, Home: 0, End: 1}[event.key];
        if (to === undefined) return;
        event.preventDefault();
        event.stopPropagation();
        this.setDivider(to);
    }
}
