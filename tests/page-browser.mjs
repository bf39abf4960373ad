// Drives chromium by its WebDriver, for page-check.mjs. Runs on Node 18 without packages.
import {spawn} from 'node:child_process';
import {once} from 'node:events';
import {createInterface} from 'node:readline';

const ELEMENT = 'element-6066-11e4-a52e-4f735466cecf';
const FLAGS = ['--headless', '--no-sandbox', '--disable-gpu', '--disable-quic', '--no-first-run',
  '--disable-background-networking', '--disable-component-update', '--disable-sync',
  '--hide-scrollbars'];

/** A headless chromium with a profile of its own. */
export class Browser {
  /** `profile` is a folder for it alone. */
  static async start(profile) {
    const browser = new Browser();
    browser.driver = spawn('chromedriver', ['--port=0'], {stdio: ['ignore', 'pipe', 'inherit']});
    const port = await new Promise((resolve, reject) => {
      browser.driver.on('exit', () => reject(new Error('chromedriver does not start')));
      createInterface({input: browser.driver.stdout}).on('line', (line) => {
        const found = /started successfully on port (\d+)/.exec(line);
        if (found) resolve(found[1]);
      });
    });
    browser.url = `http://127.0.0.1:${port}/session`;
    const options = {args: [...FLAGS, `--user-data-dir=${profile}`]};
    const answer = await browser.ask('POST', '', {capabilities: {alwaysMatch: {
      'browserName': 'chrome', 'goog:chromeOptions': options, 'timeouts': {script: 300000},
      'goog:loggingPrefs': {browser: 'ALL'}}}});
    browser.url += `/${answer.sessionId}`;
    return browser;
  }

  async ask(method, path, body) {
    const response = await fetch(this.url + path, {method, body: body && JSON.stringify(body)});
    const {value} = await response.json();
    if (!response.ok) throw new Error(`${path}: ${value.message}`);
    return value;
  }

  /** Shows `url` in a window of that size, in a colour scheme, on a screen of touch or not. */
  async open(url, {width = 1280, height = 900, scheme = 'light'} = {}) {
    await this.command('Emulation.setDeviceMetricsOverride',
      {width, height, deviceScaleFactor: 1, mobile: width < 600});
    await this.command('Emulation.setTouchEmulationEnabled', {enabled: width < 600});
    await this.command('Emulation.setEmulatedMedia',
      {features: [{name: 'prefers-color-scheme', value: scheme}]});
    await this.ask('POST', '/url', {url: 'about:blank'});
    await this.ask('POST', '/url', {url});
  }

  command(cmd, params) {
    return this.ask('POST', '/goog/cdp/execute', {cmd, params});
  }

  /** What the body of a function returns in the page. */
  run(script, ...args) {
    return this.ask('POST', '/execute/sync', {script, args});
  }

  /** Waits until the page says that something is so. */
  async until(what, condition) {
    for (let tries = 0; tries < 200; ++tries) {
      if (await this.run(`return Boolean(${condition})`)) return;
      await this.run('return new Promise((done) => setTimeout(done, 25))');
    }
    throw new Error(`never: ${what}`);
  }

  /** Types `keys` to what has the focus. */
  async type(keys) {
    const actions = [...keys].flatMap((value) =>
      [{type: 'keyDown', value}, {type: 'keyUp', value}]);
    await this.ask('POST', '/actions', {actions: [{type: 'key', id: 'keyboard', actions}]});
  }

  /** Moves pointers of a `kind` through the points of their paths at once. */
  async point(kind, ...paths) {
    await this.ask('POST', '/actions', {actions: paths.map(([first, ...rest], id) => ({
      type: 'pointer', id: `${kind}${id}`, parameters: {pointerType: kind}, actions: [
        {type: 'pointerMove', ...first, duration: 0}, {type: 'pointerDown', button: 0},
        ...rest.map((point) => ({type: 'pointerMove', ...point, duration: 30})),
        {type: 'pointerUp', button: 0}]}))});
    await this.ask('DELETE', '/actions');
  }

  async element(selector) {
    const found = await this.ask('POST', '/element', {using: 'css selector', value: selector});
    return found[ELEMENT];
  }

  async click(selector) {
    await this.ask('POST', `/element/${await this.element(selector)}/click`, {});
  }

  /** What the console has said since the last time. */
  async said() {
    const lines = await this.ask('POST', '/se/log', {type: 'browser'});
    return lines.map(({level, message}) => `${level} ${message}`);
  }

  /** The window, or all of the page, as PNG. */
  async picture(isWhole = false) {
    const {data} = await this.command('Page.captureScreenshot',
      {format: 'png', captureBeyondViewport: isWhole});
    return Buffer.from(data, 'base64');
  }

  async stop() {
    try {
      await this.ask('DELETE', '');
    } finally {
      this.driver.removeAllListeners('exit');
      if (this.driver.exitCode === null) {
        this.driver.kill();
        await once(this.driver, 'exit');
      }
    }
  }
}
