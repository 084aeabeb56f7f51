import { announce, notify } from '../app/notices';
import type { Service } from '../app/service';
import type { Credential, Network } from '../app/state';
import { Store } from '../app/store';
import { fittingCredentials } from '../credentials/matching';
import { alternatives, methodName, quoted } from '../credentials/words';
import { printable } from '../app/text';
import { follow, type Outcome } from './joining';

/** What was asked of a network last, and what came of it. */
export interface Request {
    state: 'joining' | 'leaving' | 'done' | 'failed';
    text: string;
}

/** By the network's name; outlives the view. */
export const requests = new Store<ReadonlyMap<string, Request>>(new Map());

// Each credential may take some seconds, a certificate twice, behind an attempt that runs already.
const JOIN_LIMIT = 60_000;
const LEAVE_LIMIT = 10_000;
const MOST_KEPT = 100;

function put(network: string, request: Request): void {
    requests.update((all) => {
        const others = [...all].filter(([name]) => name !== network).slice(-MOST_KEPT);
        return new Map([...others, [network, request]]);
    });
}

function end(network: string, isGood: boolean, text: string): void {
    put(network, { state: isGood ? 'done' : 'failed', text });
    if (isGood) announce(text);
    else notify(text, { kind: 'failure' });
}

export function realmsText(network: Network): string {
    if (!network.realmsKnown) return 'not known yet';
    const realms = network.realms.map((realm) => `${printable(realm.name)} (${methodName(realm.method)})`);
    return realms.join(', ') || 'none';
}

/**
 * What keeps a join from being asked for; null if nothing does. Without a credential that fits the service would leave
 * it to the system, and end the connection that there is for it.
 */
export function whyNotAsked(network: Network, credentials: readonly Credential[]): string | null {
    const name = quoted(network.name);
    if (!network.realmsKnown) return `The realms of ${name} are not known yet.`;
    if (fittingCredentials(credentials, network).length > 0) return null;
    if (network.realms.length === 0) return `${name} has no realm, and takes no credential.`;
    return `No stored credential fits ${name}: it takes ${realmsText(network)}.`;
}

const REASONS: Partial<Record<Outcome, (name: string) => string>> = {
    notStarted: (name) => `The service could not begin to join ${name}.`,
    outOfRange: (name) => `${name} is out of range.`,
    overtaken: (name) => `${name} was not joined: another network was, instead.`,
    radioOff: (name) => `${name}: the radio was turned off.`,
    adapterOut: (name) => `${name}: the adapter was taken out.`,
};

const connectedName = (service: Service) =>
    service.state.get().networks?.find((network) => network.isConnected)?.name ?? null;

function failureText(outcome: Outcome | null, name: string, tried: string): string {
    if (outcome === null) return `The service was lost: whether ${name} was joined is not known.`;
    if (outcome === 'refused') return `Could not join ${name} with ${tried}.`;
    return REASONS[outcome]?.(name) ?? `${name} was not joined within ${JOIN_LIMIT / 1000} s.`;
}

export async function join(service: Service, network: Network): Promise<void> {
    const credentials = service.state.get().credentials ?? [];
    const objection = whyNotAsked(network, credentials);
    if (objection) return end(network.name, false, objection);
    const tried = alternatives(fittingCredentials(credentials, network));
    const before = connectedName(service);
    put(network.name, { state: 'joining', text: `Trying ${tried}` });
    announce(`Joining ${quoted(network.name)}`);
    const outcome = await follow(service, network.name, true, JOIN_LIMIT);
    if (outcome === 'joined') return end(network.name, true, `Joined ${quoted(network.name)} with ${tried}.`);
    const text = failureText(outcome, quoted(network.name), tried);
    const hasEnded = before !== null && outcome !== null && connectedName(service) !== before;
    end(network.name, false, hasEnded ? `${text} The connection to ${quoted(before)} has ended.` : text);
}

export async function leave(service: Service, network: Network): Promise<void> {
    const name = quoted(network.name);
    put(network.name, { state: 'leaving', text: '' });
    const outcome = await follow(service, network.name, false, LEAVE_LIMIT);
    if (outcome === 'left')
        return end(network.name, true, `Left ${name}; the service stays away from it until a join is asked for.`);
    const lost = `The service was lost: whether ${name} was left is not known.`;
    const late = `${name} was not left within ${LEAVE_LIMIT / 1000} s.`;
    end(network.name, false, outcome === null ? lost : (REASONS[outcome]?.(name) ?? late));
}
