// The page in Debian's Chromium, as a user has it: opened from a folder, without a network.
import {execFileSync} from 'node:child_process';
import {mkdtempSync} from 'node:fs';
import {createRequire} from 'node:module';
import {tmpdir} from 'node:os';
import {dirname, join, resolve} from 'node:path';
import {fileURLToPath, pathToFileURL} from 'node:url';

const root = resolve(dirname(fileURLToPath(import.meta.url)), '../../..');
const build = join(root, 'build/web');
export const pageFile = process.env.REEL_PAGE ?? join(build, 'reel.html');
export const reelfx = process.env.REELFX ?? join(root, 'build/native/dist/reelfx');
export const plugins = join(dirname(reelfx), 'frei0r-1');
const {chromium} = createRequire(join(build, 'npm/node_modules/'))('playwright-core');

export const folder = mkdtempSync(join(tmpdir(), 'reel-page-'));

export const run = (program, ...words) => execFileSync(program, words, {
    encoding: 'utf8', stdio: ['ignore', 'pipe', 'pipe'], env: {...process.env, FREI0R_PATH: plugins}});

let browser;

export async function openBrowser() {
    browser = await chromium.launch({
        executablePath: '/usr/bin/chromium',
        args: ['--no-sandbox', '--use-fake-device-for-media-stream', '--use-fake-ui-for-media-stream'],
    });
}

export const closeBrowser = () => browser.close();

// A page that has shown its sample picture. `faults` collects what must not happen: errors and network requests.
export async function openPage({hash = '', ...options} = {}) {
    const context = await browser.newContext({viewport: {width: 1280, height: 800}, acceptDownloads: true, ...options});
    const page = await context.newPage();
    page.faults = [];
    page.on('console', (message) => {
        if (['error', 'warning'].includes(message.type())) page.faults.push(message.text());
    });
    page.on('pageerror', (error) => page.faults.push(error.message));
    page.on('request', (request) => {
        if (!/^(data|blob):/.test(request.url()) && !request.url().startsWith(pathToFileURL(pageFile).href)) {
            page.faults.push(`request: ${request.url()}`);
        }
    });
    await page.goto(pathToFileURL(pageFile).href + hash);
    await page.waitForSelector('body.ready');
    return page;
}

export async function openFile(page, file) {
    const before = await page.evaluateHandle(() => reel.player.source);
    await page.setInputFiles('#file', file);
    await page.waitForFunction((old) => reel.player.source !== old, before);
    await page.evaluate(() => reel.player.settled());
}

// What is asked of the page by `action` and saved: the file's place.
export async function saved(page, action) {
    const [download] = await Promise.all([page.waitForEvent('download', {timeout: 120000}), action()]);
    const place = join(folder, download.suggestedFilename());
    await download.saveAs(place);
    return place;
}

export const message = (page) => page.waitForSelector('#message.shown').then((element) => element.textContent());
