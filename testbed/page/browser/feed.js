// Keeps hearing what the server tells: it follows, asks where following does not work, and goes on
// trying when the server is gone.

const kQuiet = 6000; // a server says something every second
const kAskAgain = 2000;
const kTryAgain = 1000;
const kAsksBeforeFollowing = 15;

const pause = (milliseconds) => new Promise((resolve) => setTimeout(resolve, milliseconds));

export class Feed {
  /// `listener` has onDocument, onChange (false when it wants the document), onAlive, onLink.
  constructor(listener) {
    this.listener = listener;
    this.serial = () => 0;
    this.heardAt = 0;
    this.source = null;
    this.recovering = false;
  }

  start() {
    this.follow();
    setInterval(() => {
      if (this.source && performance.now() - this.heardAt > kQuiet) this.recover();
    }, 1000);
    // A browser has few connections to one server: pages that nobody sees leave them to others.
    document.addEventListener('visibilitychange', () => {
      if (document.hidden) this.stop();
      else if (!this.source && !this.recovering) this.follow();
    });
  }

  stop() {
    this.source?.close();
    this.source = null;
  }

  follow() {
    this.stop();
    this.heardAt = performance.now();
    const source = new EventSource('/page/events');
    this.source = source;
    const on = (name, act) => source.addEventListener(name, (event) => {
      this.heardAt = performance.now();
      this.listener.onLink('following');
      act(JSON.parse(event.data));
    });
    on('document', (data) => this.listener.onDocument(data));
    on('change', (data) => {
      if (!this.listener.onChange(data)) this.recover();
    });
    on('alive', (data) => this.listener.onAlive(data));
    source.onerror = () => {
      if (this.source === source) this.recover();
    };
  }

  async ask() {
    const response = await fetch(`/page.json?since=${this.listener.serial()}`, { cache: 'no-store' });
    if (!response.ok) throw new Error(`status ${response.status}`);
    const data = await response.json();
    if (data.page) this.listener.onDocument(data);
    else this.listener.onAlive(data);
  }

  async recover() {
    this.stop();
    if (this.recovering) return;
    this.recovering = true;
    const before = this.lastRecovery ?? -Infinity;
    this.lastRecovery = performance.now();
    // A stream that breaks again at once does not get through to here.
    let asks = this.lastRecovery - before > 2 * kQuiet ? kAsksBeforeFollowing : 0;
    for (;;) {
      if (document.hidden) await pause(kTryAgain);
      try {
        await this.ask();
        if (asks++ >= kAsksBeforeFollowing) break;
        this.listener.onLink('asking');
        await pause(kAskAgain);
      } catch {
        this.listener.onLink('lost');
        asks = kAsksBeforeFollowing;
        await pause(kTryAgain);
      }
    }
    this.recovering = false;
    this.follow();
  }
}
