// The page: brings picture, look and controls together.
import sample from 'page:sample';
import wasm from 'page:wasm';
import workerScript from 'page:worker';

import {addressOf, readAddress} from './address.js';
import {Controls} from './controls.js';
import {Keeper} from './keeper.js';
import {Looks} from './looks.js';
import {Player} from './player.js';
import {isPresetFileName, presetExtension, readPresetFile} from './preset_file.js';
import {Renderer} from './renderer.js';
import {openCamera, openFile, openPicture, tooLarge} from './sources.js';
import {Stage} from './stage.js';
import {Strip} from './strip.js';
import {language, languages, preferredLanguage, setLanguage, text} from './texts.js';

const at = (id) => document.getElementById(id);

const firstLook = {effect: 'Film Pro', preset: 'Super 8'};
const liveThumbnails = 1500;  // milliseconds between two rounds while the clip plays

function say(key) {
    const message = at('message');
    message.textContent = text(key);
    message.classList.add('shown');
    clearTimeout(say.timer);
    say.timer = setTimeout(() => message.classList.remove('shown'), 6000);
}

function newLook(effects) {
    const effect = effects.findIndex(({name}) => name === firstLook.effect);
    const values = effects.map(({params}) => params.map((param) => param.default));
    values[effect] = effects[effect].presets.find(({name}) => name === firstLook.preset).values;
    return {effect, values, seed: 0};
}

class Page {
    constructor(renderer, effects) {
        this.renderer = renderer;
        this.effects = effects;
        this.looks = new Looks(effects, newLook(effects));
        this.player = new Player(renderer, this.looks);
        this.stage = new Stage(at('stage'), at('frame'), at('divider'));
        this.controls = new Controls(at('controls'), this.looks);
        this.strip = new Strip(at('strip'), effects, this.looks);
        this.keeper = new Keeper(renderer, this.player, this.looks, say,
            () => addressOf(effects, this.looks.rendered));
        this.addEffects();
        this.addLanguages();
        this.connect();
        this.readAddress();
    }

    addEffects() {
        at('file').accept += this.effects.map((_, i) => `,${presetExtension(i)}`).join('');
        this.effects.forEach((effect, i) => {
            const tab = document.createElement('button');
            tab.type = 'button';
            tab.setAttribute('role', 'tab');
            tab.setAttribute('aria-controls', 'controls');
            tab.textContent = effect.name.replace('Film ', '');
            tab.setAttribute('aria-label', effect.name);
            tab.onclick = () => {
                this.looks.change({effect: i});
                this.strip.reveal();
            };
            at('effects').append(tab);
        });
        at('effects').onkeydown = (event) => {
            const by = {ArrowRight: 1, ArrowLeft: -1}[event.key];
            if (!by) return;
            event.preventDefault();
            event.stopPropagation();
            const tabs = [...at('effects').children];
            const tab = tabs.at((tabs.indexOf(event.target) + by) % tabs.length);
            tab.click();
            tab.focus();
        };
    }

    addLanguages() {
        const select = at('language');
        for (const {code, name} of languages) {
            const option = new Option(name, code);
            option.lang = code;
            select.add(option);
        }
        select.onchange = () => {
            setLanguage(select.value);
            this.controls.show(true);
            this.showState();
        };
        setLanguage(preferredLanguage());
        select.value = language();
    }

    connect() {
        const {looks, player} = this;
        looks.onChange = () => {
            player.draw();
            this.showLook();
        };
        player.onShown = () => this.showState();
        player.onFailure = () => say('This picture cannot be shown.');
        this.strip.onWanted = () => this.wantThumbnails();
        this.renderer.onThumbnail = (id, bitmap) => this.strip.draw(id, bitmap);
        const actions = {
            open: () => at('file').click(),
            camera: () => this.open(openCamera, 'The camera cannot be used.'),
            sample: () => this.openSample(),
            play: () => player.source.isPlaying ? player.source.pause() : player.source.play(),
            full: () => this.stage.toggleFullScreen(at('viewer')),
            slotA: () => looks.choose(0),
            slotB: () => looks.choose(1),
            undo: () => looks.undo(),
            redo: () => looks.redo(),
            reset: () => looks.setValues(looks.look.effect, looks.effect.params.map((param) => param.default)),
            newSeed: () => looks.change({seed: crypto.getRandomValues(new Uint32Array(1))[0] % 1000000}),
            licence: () => at('licences').showModal(),
        };
        for (const [id, action] of Object.entries(actions)) at(id).onclick = action;
        at('file').onchange = ({target}) => {
            if (target.files.length > 0) this.openDropped(target.files[0]);
            target.value = '';
        };
        at('scrub').oninput = ({target}) => player.source.seek(Number(target.value));
        at('seed').onchange = ({target}) => looks.change(
            {seed: Math.min(Math.max(Math.trunc(Number(target.value)) || 0, 0), 0xffffffff)});
        this.connectDrop();
        window.addEventListener('hashchange', () => this.readAddress());
        document.addEventListener('keydown', (event) => this.key(event, actions));
        setInterval(() => {
            this.showRate();
            if (player.source?.isPlaying) this.wantThumbnails();
        }, liveThumbnails);
    }

    connectDrop() {
        const over = (isOver) => document.body.classList.toggle('dropping', isOver);
        document.addEventListener('dragover', (event) => {
            event.preventDefault();
            over(true);
        });
        document.addEventListener('dragleave', (event) => over(event.relatedTarget !== null));
        document.addEventListener('drop', (event) => {
            event.preventDefault();
            over(false);
            if (event.dataTransfer.files.length > 0) this.openDropped(event.dataTransfer.files[0]);
        });
        document.addEventListener('paste', (event) => {
            if (event.clipboardData.files.length > 0) this.openDropped(event.clipboardData.files[0]);
        });
    }

    key(event, actions) {
        if (document.querySelector('dialog[open]')) return;
        const isTyping = event.target.matches('input[type=number], textarea, select');
        const {key, shiftKey} = event;
        if ((event.ctrlKey || event.metaKey) && key.toLowerCase() === 'z' && !isTyping) {
            event.preventDefault();
            actions[shiftKey ? 'redo' : 'undo']();
            return;
        }
        if (isTyping || event.ctrlKey || event.metaKey || event.altKey) return;
        const other = this.looks.slot === 0 ? 'slotB' : 'slotA';
        const name = {' ': 'play', f: 'full', c: other, n: 'newSeed', o: 'open'}[key.toLowerCase()];
        if (!name || key === ' ' && event.target.matches('button, input')) return;
        event.preventDefault();
        actions[name]();
    }

    // A look of the address; the page's own when there is none.
    readAddress() {
        const wanted = location.hash;
        if (wanted.length < 2 || wanted === this.address) return;
        const read = readAddress(this.effects, wanted);
        if (read === null) {
            say('This link does not contain a look.');
            return;
        }
        const {effect, values, seed} = read;
        this.looks.change({effect, seed, values: this.looks.look.values.map((old, i) => i === effect ? values : old)});
    }

    async open(opening, failure) {
        try {
            const source = await opening();
            this.player.setSource(source);
            this.stage.setSize(source.width, source.height);
            document.body.dataset.source = source.kind;
            this.setRatio(source.width / source.height);
            this.keeper.setSource(source);
            await this.player.settled();
            this.wantThumbnails();
            source.play();
        } catch (error) {
            say(error.message === tooLarge ? tooLarge : failure);
        }
    }

    // Of the picture on narrow screens and of the thumbnails, whose names want some width.
    setRatio(ratio) {
        const {style} = document.body;
        style.setProperty('--ratio', Math.min(Math.max(ratio, 0.7), 2.4));
        style.setProperty('--thumbnail-ratio', Math.min(Math.max(ratio, 1.3), 2));
        this.strip.reveal('instant');
    }

    openSample() {
        return this.open(() => openPicture(sample, 'sample.jpg'), 'This picture cannot be shown.');
    }

    async openDropped(file) {
        if (!isPresetFileName(file.name)) {
            return this.open(() => openFile(file), 'This file contains no picture or clip that this browser can show.');
        }
        const read = await readPresetFile(this.effects, file);
        if (read === null) {
            say('This is not a preset file of these effects.');
            return;
        }
        this.looks.setValues(read.effect, read.values);
        this.strip.reveal();
    }

    // Thumbnails of what is in sight, from the picture of now; the newest wish counts.
    async wantThumbnails() {
        const source = this.player.source;
        if (!source || this.isAskingThumbnails) return;
        this.isAskingThumbnails = true;
        try {
            await this.renderer.thumbnails(await source.picture(), this.strip.wanted(), source.seconds);
        } catch {
            // A source that has been closed in between has none; the next one asks again.
            if (source === this.player.source) say('This picture cannot be shown.');
        }
        this.isAskingThumbnails = false;
    }

    showLook() {
        const {looks} = this;
        this.controls.show();
        this.strip.show();
        [...at('effects').children].forEach((tab, i) => {
            const isChosen = i === looks.look.effect;
            tab.setAttribute('aria-selected', isChosen);
            tab.tabIndex = isChosen ? 0 : -1;
        });
        at('undo').disabled = !looks.canUndo;
        at('redo').disabled = !looks.canRedo;
        at('slotA').setAttribute('aria-pressed', looks.slot === 0);
        at('slotB').setAttribute('aria-pressed', looks.slot === 1);
        if (looks.look.seed !== this.seed) {
            this.seed = looks.look.seed;
            at('seed').value = this.seed;
            this.wantThumbnails();
        }
        this.address = addressOf(this.effects, looks.rendered);
        clearTimeout(this.addressTimer);
        this.addressTimer = setTimeout(() => history.replaceState(null, '', this.address), 250);
    }

    showState() {
        const source = this.player.source;
        if (!source) return;
        const play = at('play');
        const label = text(source.isPlaying ? 'Pause' : 'Play');
        play.classList.toggle('playing', source.isPlaying);
        play.setAttribute('aria-label', label);
        play.title = `${label} (${play.dataset.keys})`;
        const scrub = at('scrub');
        const isEndless = !Number.isFinite(source.duration);
        scrub.disabled = isEndless;
        scrub.max = isEndless ? 1 : source.duration;
        scrub.value = isEndless ? 0 : source.seconds;
        scrub.style.setProperty('--share', isEndless ? '0%' : `${source.seconds / source.duration * 100}%`);
        scrub.setAttribute('aria-valuetext', `${source.seconds.toFixed(1)} s`);
        at('time').textContent = isEndless ? '' : clock(source.seconds);
    }

    showRate() {
        const {player} = this;
        const rate = player.frameRate;
        at('rate').textContent = player.source?.isPlaying && rate > 0
            ? `${rate} fps${player.isHalfSize ? ' · ½' : ''}` : '';
    }
}

function clock(seconds) {
    const minutes = Math.floor(seconds / 60);
    return `${minutes}:${(seconds - minutes * 60).toFixed(2).padStart(5, '0')}`;
}

async function start() {
    try {
        const renderer = new Renderer(workerScript);
        const canvases = ['result', 'plain'].map((id) => at(id).transferControlToOffscreen());
        const {effects} = await renderer.start(await wasm(), ...canvases);
        const page = new Page(renderer, effects);
        window.reel = page;  // for whoever looks into the page, and for its tests
        page.showLook();
        await page.openSample();
        document.body.classList.add('ready');
    } catch (error) {
        console.error(error);
        setLanguage(preferredLanguage());
        say('This browser is too old for this page.');
    }
}

start();
