import type { Credential, Network, Realm } from '../app/state';
import { TYPE_USER } from './words';

export const METHOD_TLS = 1;
export const METHOD_TTLS = 2;

const MOST_BYTES = 255;

/**
 * The bytes in which the service compares a credential's realm with those in the air, a character for each. Null if
 * it fits no network: beyond Latin-1, too long, or empty, which any access point may announce.
 */
export function realmBytes(realm: string): string | null {
    const isTold = realm !== '' && realm.length <= MOST_BYTES && !/[^\u0000-\u00ff]/.test(realm);
    return isTold ? realm : null;
}

// A network's realm is told as text; in the air it was UTF-8.
function announced(realm: Realm): string {
    return `${realm.method} ${String.fromCharCode(...new TextEncoder().encode(realm.name))}`;
}

function isComplete(credential: Credential): boolean {
    if (credential.CredentialEapMethod === METHOD_TTLS) return credential.Username !== '' && credential.Password !== '';
    return credential.CredentialEapMethod === METHOD_TLS;
}

/** What a network has to announce to take it; null if none can. */
function wanted(credential: Credential): string | null {
    const bytes = realmBytes(credential.RealName);
    return bytes !== null && isComplete(credential) ? `${credential.CredentialEapMethod} ${bytes}` : null;
}

/** The credentials with which the service tries to join a network, in its order. */
export function fittingCredentials(all: readonly Credential[], network: Network): Credential[] {
    const realms = new Set(network.realms.map(announced));
    return all.filter((credential) => {
        const realm = wanted(credential);
        return realm !== null && realms.has(realm);
    });
}

/** For each credential that any of them would take, by its id, these networks. */
export function networksByCredential(
    credentials: readonly Credential[],
    networks: readonly Network[],
): ReadonlyMap<number, readonly Network[]> {
    const byRealm = new Map<string, Network[]>();
    for (const network of networks) {
        for (const realm of new Set(network.realms.map(announced)))
            byRealm.set(realm, [...(byRealm.get(realm) ?? []), network]);
    }
    const taking = new Map<number, readonly Network[]>();
    for (const credential of credentials) {
        const found = byRealm.get(wanted(credential) ?? '');
        if (found) taking.set(credential.Id, found);
    }
    return taking;
}

/** Why no network at all would take it; null if one may. */
export function whyNeverTaken(credential: Credential): string | null {
    if (credential.RealName === '') return 'It has no realm, and fits no network.';
    if (realmBytes(credential.RealName) === null) return 'Its realm has characters that no network can announce.';
    if (isComplete(credential)) return null;
    return credential.Type === TYPE_USER ? 'Its user name or password is missing.' : 'Its method is not known.';
}
