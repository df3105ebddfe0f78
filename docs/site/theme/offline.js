// Lets the search work where the site is opened as a file. There a page may neither fetch the index
// nor start a worker: the index comes as a script, and the worker runs in a hidden frame.
if (location.protocol === "file:") {
    const base = new URL(".", document.currentScript.src);
    const load = (document, url) => new Promise(done => {
        const script = document.createElement("script");
        script.src = url;
        script.onload = done;
        document.head.append(script);
    });
    window.__search = {
        index: load(document, new URL("search/search_index.js", base)).then(() => __index),
    };
    window.Worker = class extends EventTarget {
        constructor(url) {
            super();
            const frame = document.createElement("iframe");
            frame.hidden = true;
            document.body.append(frame);
            this.inside = frame.contentWindow;
            this.inside.postMessage = data => this.dispatchEvent(new MessageEvent("message", { data }));
            this.ready = load(this.inside.document, new URL(url, location));
        }
        postMessage(data) {
            this.ready.then(() => this.inside.dispatchEvent(new MessageEvent("message", { data })));
        }
    };
}
