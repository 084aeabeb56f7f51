// Simulated machines with their service, and the panel on them; all of it ends with its test.
import { execFile, spawn } from 'node:child_process';
import { mkdtemp, readFile, rm, writeFile } from 'node:fs/promises';
import { tmpdir } from 'node:os';
import { join } from 'node:path';
import { createInterface } from 'node:readline';
import { promisify } from 'node:util';
import { Control } from './control.mjs';

const PATIENCE = 20_000;
const program = join(process.env.VEXA_BUILD ?? 'build/release', 'bin', 'vexa');
const environment = Object.fromEntries(Object.entries(process.env).filter(([name]) => !name.startsWith('VEXA_')));

/** Gives the first true value of the condition. */
export async function until(condition, what) {
    const end = Date.now() + PATIENCE;
    for (;;) {
        const value = await condition();
        if (value) return value;
        if (Date.now() > end) throw new Error(`not within ${PATIENCE} ms: ${what}`);
        await new Promise((resolve) => setTimeout(resolve, 20));
    }
}

class Running {
    constructor(parameters) {
        this.process = spawn(program, parameters, { env: environment, stdio: ['ignore', 'pipe', 'pipe'] });
        this.errors = '';
        this.process.stderr.on('data', (data) => (this.errors += data));
        this.ended = new Promise((resolve) => this.process.once('exit', resolve));
    }

    firstLine() {
        return new Promise((resolve, reject) => {
            createInterface(this.process.stdout).once('line', resolve);
            this.ended.then((code) => reject(new Error(`ended with ${code}: ${this.errors}`)));
        });
    }

    async stop() {
        this.process.kill('SIGTERM');
        const timer = setTimeout(() => this.process.kill('SIGKILL'), PATIENCE);
        await this.ended;
        clearTimeout(timer);
        if (this.process.signalCode === 'SIGKILL') throw new Error(`${this.process.spawnargs[1]} did not end by itself`);
    }
}

/** A network of a scenario: its realms with their EAP methods, 13 for a certificate, 21 for a password. */
export function network(number, ssid, realms = {}, more = {}) {
    const entries = Object.entries(realms).map(([name, eapMethods]) => ({ names: [name], eapMethods }));
    return { bssid: `02:aa:00:00:00:${number.toString(16).padStart(2, '0')}`, ssid, realms: entries, ...more };
}

const LOGGING = `<?xml version="1.0" encoding="UTF-8"?><configurations><global><enabledump>true</enabledump>
<nextcredid>1</nextcredid></global><credentials></credentials><users></users></configurations>`;

class Machine {
    /** The machine lives twenty times as fast as the clock, with the log on, if the scenario doesn't say otherwise. */
    constructor(folder, scenario) {
        this.folder = folder;
        this.scenario = { speed: 20, config: LOGGING, ...scenario };
    }

    async start() {
        const path = join(this.folder, 'scenario-of-test.json');
        await writeFile(path, JSON.stringify(this.scenario));
        this.parent = new Running(['start', '--machine', this.folder, '--scenario', path, '--control-port', '0']);
        const line = await this.parent.firstLine();
        this.control = await Control.open(Number(/control=(\d+)/.exec(line)[1]));
    }

    /** Ends the service as a crash would, and its parent with it. */
    async kill() {
        const { pid } = this.parent.process;
        const children = await readFile(`/proc/${pid}/task/${pid}/children`, 'utf8');
        process.kill(Number(children.trim()), 'SIGKILL');
        await this.parent.ended;
        this.control.close();
    }

    /** The same machine, its configuration as it is. */
    async startAgain() {
        delete this.scenario.config;
        await this.start();
    }

    async stop() {
        this.control.close();
        await this.parent.stop();
        await rm(this.folder, { recursive: true, force: true });
    }

    /** A command of `vexa`; gives what it prints. */
    async vexa(parameters, input = '') {
        const running = promisify(execFile)(program, parameters, {
            env: { ...environment, VEXA_MACHINE: this.folder },
        });
        running.child.stdin.end(input);
        return (await running).stdout;
    }

    addUser(name, realm, password = 'secret', ...more) {
        const parameters = ['credential', 'add', '--name', name, '--realm', realm, '--username', 'anna'];
        return this.vexa([...parameters, '--password-stdin', ...more], password);
    }

    /** The ids of the stored credentials, in the order of priority that the file has. */
    async orderInFile() {
        const text = await readFile(join(this.folder, 'Public/Roaming/Korvane/config.xml'), 'utf8');
        const entries = [...text.matchAll(/<id>(\d+)<\/id><priority>(\d+)<\/priority>/g)];
        return entries.sort((a, b) => a[2] - b[2]).map(([, id]) => Number(id));
    }
}

export async function startMachine(t, scenario = {}) {
    const machine = new Machine(await mkdtemp(join(tmpdir(), 'vexa-panel-')), scenario);
    t.after(() => machine.stop());
    await machine.start();
    return machine;
}

/** The panel on a machine; gives the address that lets in once. */
export async function startPanel(t, machine) {
    const panel = new Running(['panel', '--machine', machine.folder, '--recordings', machine.folder, '--no-open']);
    t.after(() => panel.stop());
    return panel.firstLine();
}
