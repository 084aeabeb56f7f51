// The hotspot port's command GET_IS_CARD_IN as one would write it with Node: prints its port, serves until its standard
// input ends.
const { WebSocketServer } = require("ws");

const pad = (number) => String(number).padStart(2, "0");

function timestamp() {
    const now = new Date();
    const date = [now.getFullYear(), pad(now.getMonth() + 1), pad(now.getDate())].join("-");
    return `${date}T${[now.getHours(), now.getMinutes(), now.getSeconds()].map(pad).join(":")} `;
}

const commands = new Map([["GET_IS_CARD_IN", () => ({ Data: "", EventId: "CARD_PLUG_OUT" })]]);

function answer(message) {
    const command = commands.get(JSON.parse(message).CommandId);
    return command && JSON.stringify({ ...command(), Source: "HotSpot20", Timestamp: timestamp() }, null, 3);
}

const server = new WebSocketServer({ host: "127.0.0.1", port: 0, perMessageDeflate: false });
server.on("listening", () => console.log(server.address().port));
server.on("connection", (client) => {
    client.on("message", (message) => {
        const event = answer(message);
        if (event) for (const each of server.clients) each.send(event);
    });
});
process.stdin.on("end", () => process.exit()).resume();
