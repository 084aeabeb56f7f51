import type { Credential } from '../app/state';
import { printable } from '../app/text';

export const TYPE_USER = 1;
export const TYPE_CERTIFICATE = 3;
export const ALL_USERS = 1;
export const THIS_USER = 2;

const METHODS: Record<number, string> = { 1: 'EAP-TLS', 2: 'EAP-TTLS' };

export function methodName(method: number): string {
    return METHODS[method] ?? `method ${method}`;
}

export function quoted(name: string): string {
    return `“${printable(name)}”`;
}

export function nameOf(credential: Credential): string {
    return quoted(credential.CredentialName || credential.RealName);
}

/** “A”, “A” or “B”, “A”, “B” or “C”. */
export function alternatives(credentials: readonly Credential[]): string {
    const names = credentials.map(nameOf);
    return names.length < 2 ? names.join('') : `${names.slice(0, -1).join(', ')} or ${names.at(-1)}`;
}

/** Who proves himself by it. */
export function identityOf(credential: Credential): string {
    const text = credential.Type === TYPE_CERTIFICATE ? credential.ClientCert : credential.Username;
    return printable(text);
}
