// Puts the page together: page.html with its style, scripts, texts, sample picture and the effects.
//
//   node build.mjs --wasm FILE --texts FILE --sample FILE --modules FOLDER --out FOLDER [--single]
//
// OUT gets reel.html; with --single the effects are in it and it also works as a file, without any server. Otherwise
// they lie beside it as reel.wasm, which a server has to serve.
import {copyFileSync, mkdirSync, readFileSync, writeFileSync} from 'node:fs';
import {createRequire} from 'node:module';
import {dirname, join, resolve} from 'node:path';
import {fileURLToPath} from 'node:url';
import {parseArgs} from 'node:util';

const {values: options} = parseArgs({options: {
    wasm: {type: 'string'}, texts: {type: 'string'}, sample: {type: 'string'}, modules: {type: 'string'},
    out: {type: 'string'}, single: {type: 'boolean', default: false},
}});
const here = dirname(fileURLToPath(import.meta.url));
options.modules = resolve(options.modules);
const {build} = createRequire(join(options.modules, 'index.js'))('esbuild');

// The categories of the language file that the page shows: its own texts, names of controls.
const categories = ['9', '10'];

const plain = (xml) => xml.replace(/\s+/g, ' ').trim().replaceAll('&lt;', '<').replaceAll('&gt;', '>')
    .replaceAll('&amp;', '&');

// [{code, name, texts}]; the language file is of a strict form of our own.
function readTexts(file) {
    const xml = readFileSync(file, 'utf8').replace(/<!--[^]*?-->/g, '');
    const languages = [...xml.matchAll(/<language code="(\w+)" name="([^"]+)">([^]*?)<\/language>/g)];
    return languages.map(([, code, name, inside]) => {
        const texts = {};
        for (const [, id, entries] of inside.matchAll(/<category id="(\d+)">([^]*?)<\/category>/g)) {
            if (!categories.includes(id)) continue;
            for (const [, key, text] of entries.matchAll(/<text key="([^"]+)">([^<]*)<\/text>/g)) {
                // What is the same in English needs no entry.
                if (plain(key) !== plain(text)) texts[plain(key)] = plain(text);
            }
        }
        return {code, name, texts};
    });
}

const base64 = (file) => readFileSync(file).toString('base64');

function wasmModule() {
    if (!options.single) return `export default async () => (await fetch('reel.wasm')).arrayBuffer();`;
    return `const text = '${base64(options.wasm)}';
        export default async () => Uint8Array.from(atob(text), (c) => c.charCodeAt(0));`;
}

// Modules that are made, not written: "page:NAME".
function madeModules(modules) {
    return {
        name: 'made modules',
        setup(builder) {
            builder.onResolve({filter: /^page:/}, ({path}) => ({path, namespace: 'page'}));
            builder.onLoad({filter: /.*/, namespace: 'page'}, ({path}) => ({contents: modules[path.slice(5)]}));
        },
    };
}

async function bundle(entry, format, modules) {
    const {outputFiles} = await build({
        entryPoints: [join(here, 'source', entry)], bundle: true, write: false, minify: true, format, target: 'es2022',
        charset: 'utf8', legalComments: 'none', nodePaths: [options.modules], plugins: [madeModules(modules)],
        logLevel: 'warning',
    });
    return outputFiles[0].text;
}

function licences() {
    const folder = join(options.modules, 'mediabunny');
    const {version} = JSON.parse(readFileSync(join(folder, 'package.json'), 'utf8'));
    const text = `Velmora Reel Effects\n\n${readFileSync(join(here, '../../LICENSE'), 'utf8')}\n\n` +
        `Clips are read and written by Mediabunny ${version}. Its source is the npm package "mediabunny".\n\n` +
        readFileSync(join(folder, 'LICENSE'), 'utf8');
    return text.replaceAll('&', '&amp;').replaceAll('<', '&lt;');
}

const worker = await bundle('render_worker.js', 'iife', {});
const parts = {
    SCRIPT: await bundle('main.js', 'esm', {
        sample: `export default 'data:image/jpeg;base64,${base64(options.sample)}';`,
        texts: `export default ${JSON.stringify(readTexts(options.texts))};`,
        wasm: wasmModule(),
        worker: `export default ${JSON.stringify(worker)};`,
    }),
    STYLE: readFileSync(join(here, 'page.css'), 'utf8').replace(/\/\*[^]*?\*\/\n?/g, ''),
    LICENCES: licences(),
    CONNECT: options.single ? "'none'" : "'self'",
};
const page = readFileSync(join(here, 'page.html'), 'utf8').replace(/@([A-Z]+)@/g, (mark, name) => parts[name]);
mkdirSync(options.out, {recursive: true});
writeFileSync(join(options.out, 'reel.html'), page);
if (!options.single) copyFileSync(options.wasm, join(options.out, 'reel.wasm'));
