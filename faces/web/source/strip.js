// All presets of all effects as a strip of pictures of the user's own clip.

export class Strip {
    #place;
    #looks;
    #effects;
    #cells = [];
    #visible = new Set();
    #observer;
    onWanted = () => {};

    constructor(place, effects, looks) {
        this.#place = place;
        this.#effects = effects;
        this.#looks = looks;
        this.#observer = new IntersectionObserver((entries) => this.#watch(entries),
            {root: place, rootMargin: '0px 300px'});
        effects.forEach((effect, number) => this.#addGroup(effect, number));
        place.onkeydown = (event) => this.#key(event);
    }

    // The looks of the cells in sight: [{id, look}].
    wanted() {
        const seed = this.#looks.look.seed;
        return [...this.#visible].sort((a, b) => a - b).map((id) => {
            const {effect, preset} = this.#cells[id];
            return {id, look: {effect, seed, values: this.#effects[effect].presets[preset].values}};
        });
    }

    draw(id, bitmap) {
        const canvas = this.#cells[id].canvas;
        canvas.width = bitmap.width;
        canvas.height = bitmap.height;
        canvas.getContext('bitmaprenderer').transferFromImageBitmap(bitmap);
    }

    // Marks the present look's preset; brings the effect's presets into sight when it is another effect's.
    show() {
        const {effect} = this.#looks.look;
        const preset = this.#looks.preset;
        let stop = null;
        this.#cells.forEach((cell) => {
            const isChosen = cell.effect === effect && cell.preset === preset;
            cell.button.setAttribute('aria-selected', isChosen);
            cell.button.tabIndex = -1;
            if (isChosen) stop = cell;
        });
        // One place in the strip is reached by the Tab key.
        (stop ?? this.#cells.find((cell) => cell.effect === effect)).button.tabIndex = 0;
    }

    // `behavior` as scrollTo has it.
    reveal(behavior = 'smooth') {
        const {effect} = this.#looks.look;
        const preset = Math.max(0, this.#looks.preset);
        const {button} = this.#cells.find((cell) => cell.effect === effect && cell.preset === preset);
        const left = button.offsetLeft - (this.#place.clientWidth - button.offsetWidth) / 2;
        this.#place.scrollTo({left, behavior});
    }

    #addGroup(effect, number) {
        const group = document.createElement('div');
        group.setAttribute('role', 'group');
        group.setAttribute('aria-label', effect.name);
        const title = document.createElement('span');
        title.className = 'title';
        title.setAttribute('aria-hidden', 'true');
        title.textContent = effect.name;
        group.append(title);
        effect.presets.forEach((preset, i) => group.append(this.#addCell(number, i, preset.name)));
        this.#place.append(group);
    }

    #addCell(effect, preset, name) {
        const button = document.createElement('button');
        const id = this.#cells.length;
        button.type = 'button';
        button.setAttribute('role', 'option');
        button.dataset.cell = id;
        const canvas = document.createElement('canvas');
        canvas.setAttribute('aria-hidden', 'true');
        const label = document.createElement('span');
        label.textContent = name;
        button.append(canvas, label);
        button.onclick = () => this.#choose(id);
        this.#cells.push({effect, preset, button, canvas});
        this.#observer.observe(button);
        return button;
    }

    #choose(id) {
        const {effect, preset} = this.#cells[id];
        this.#looks.setValues(effect, this.#effects[effect].presets[preset].values);
    }

    #key(event) {
        const from = Number(event.target.closest?.('[data-cell]')?.dataset.cell ?? -1);
        const to = {ArrowRight: from + 1, ArrowLeft: from - 1, Home: 0, End: this.#cells.length - 1}[event.key];
        if (from < 0 || to === undefined || !this.#cells[to]) return;
        event.preventDefault();
        this.#choose(to);
        this.#cells[to].button.focus();
        this.#cells[to].button.scrollIntoView({block: 'nearest', inline: 'nearest'});
    }

    #watch(entries) {
        for (const {target, isIntersecting} of entries) {
            const id = Number(target.dataset.cell);
            if (isIntersecting) this.#visible.add(id);
            else this.#visible.delete(id);
        }
        this.onWanted();
    }
}
