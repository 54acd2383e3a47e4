// The engine in a worker of its own, so that typing never waits for an answer.  A question that takes long is given up
// with the worker as soon as a newer one arrives.

const patience = 3000; // milliseconds that a newer question waits for an older one

class Engine {
    constructor() {
        this.source = URL.createObjectURL(new Blob([document.getElementById('engine').textContent], { type: 'text/javascript' }));
        this.start();
    }

    start() {
        this.waiting = new Map();
        this.next = 0;
        this.worker = new Worker(this.source);
        this.worker.onmessage = ({ data: { id, result, error } }) => {
            const { resolve, reject } = this.waiting.get(id);
            this.waiting.delete(id);
            if (error) reject(Object.assign(new Error(error.message), error));
            else resolve(result);
        };
        this.worker.onerror = (event) => this.abandon(new Error(event.message || 'the engine ended'));
    }

    abandon(reason) {
        this.worker.terminate();
        const { waiting } = this;
        this.start();
        for (const { reject } of waiting.values()) reject(reason);
    }

    /** Calls a function of the engine. */
    ask(name, ...args) {
        return new Promise((resolve, reject) => {
            this.waiting.set(this.next, { resolve, reject });
            this.worker.postMessage({ id: this.next++, name, args });
        });
    }

    /** Makes room for a new question: gives up an old one that is still being worked on after a while. */
    renew() {
        clearTimeout(this.timer);
        const oldest = Math.min(...this.waiting.keys());
        if (oldest !== Infinity)
            this.timer = setTimeout(() => this.waiting.has(oldest) && this.abandon(new Error('given up for a newer question')), patience);
    }
}
