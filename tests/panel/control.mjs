// A client of a simulated machine's control channel: a WebSocket with one small text at a time.
import { randomBytes } from 'node:crypto';
import { request } from 'node:http';

function frame(text) {
    const payload = Buffer.from(text);
    const mask = randomBytes(4);
    const length = payload.length < 126 ? [0x80 | payload.length] : [0xfe, payload.length >> 8, payload.length & 255];
    return Buffer.concat([Buffer.from([0x81, ...length]), mask, payload.map((byte, i) => byte ^ mask[i % 4])]);
}

export class Control {
    #socket;
    #received = Buffer.alloc(0);
    #waiting = [];

    constructor(socket) {
        this.#socket = socket;
        socket.on('data', (data) => this.#take(data));
        socket.on('error', () => {});
    }

    static open(port) {
        const headers = {
            Connection: 'Upgrade',
            Upgrade: 'websocket',
            'Sec-WebSocket-Version': 13,
            'Sec-WebSocket-Key': randomBytes(16).toString('base64'),
        };
        return new Promise((resolve, reject) => {
            const asking = request({ host: '127.0.0.1', port, headers });
            asking.once('upgrade', (_, socket) => resolve(new Control(socket)));
            asking.once('response', ({ statusCode }) => reject(new Error(`control channel: ${statusCode}`)));
            asking.once('error', reject);
            asking.end();
        });
    }

    /** Carries out an action; gives the result of a query. */
    async ask(message) {
        this.#socket.write(frame(JSON.stringify(message)));
        const answer = JSON.parse(await new Promise((resolve) => this.#waiting.push(resolve)));
        if (!answer.ok) throw new Error(`${JSON.stringify(message)}: ${answer.error}`);
        return answer.result;
    }

    do(action, members = {}) {
        return this.ask({ do: action, ...members });
    }

    close() {
        this.#socket.destroy();
    }

    #take(data) {
        this.#received = Buffer.concat([this.#received, data]);
        for (;;) {
            const short = this.#received[1] & 127;
            const head = short === 126 ? 4 : short === 127 ? 10 : 2;
            if (this.#received.length < head) return;
            const [two, eight] = [() => this.#received.readUInt16BE(2), () => Number(this.#received.readBigUInt64BE(2))];
            const length = short === 126 ? two() : short === 127 ? eight() : short;
            if (this.#received.length < head + length) return;
            this.#waiting.shift()?.(this.#received.subarray(head, head + length).toString());
            this.#received = this.#received.subarray(head + length);
        }
    }
}
