import { handled } from '../app/checkpoint';
import type { Service } from '../app/service';
import type { Credential } from '../app/state';
import { clashOf } from './form';
import { nameOf } from './words';

/** A command, how a list shows that it was carried out, and why it may not have been. */
export interface Change {
    command: string;
    data: unknown;
    isShown(list: readonly Credential[]): boolean;
    whyNot(list: readonly Credential[]): string;
}

export type Result = { isDone: true } | { isDone: false; why: string };

const LOST = 'The service was lost: whether the change was made is not known.';
const UNKNOWN = 'the service refused it; its log may say why';

const byId = (list: readonly Credential[], id: number) => list.find((credential) => credential.Id === id);

const COMPARED: readonly (keyof Credential)[] = [
    'Type',
    'AccessType',
    'AutoConnect',
    'CredentialName',
    'RealName',
    'CaCert',
    'ClientCert',
    'Username',
];

// A password is not told, only whether there is one.
function isLike(stored: Credential, wanted: Credential): boolean {
    return (
        COMPARED.every((member) => stored[member] === wanted[member]) &&
        (stored.Password === '') === (wanted.Password === '')
    );
}

function said(objections: object): string {
    const [text] = Object.values(objections) as string[];
    return text === undefined ? UNKNOWN : `its realm or name ${text}`;
}

export function addition(wanted: Credential, before: readonly Credential[]): Change {
    const { Id: _, Creator: __, ...data } = wanted;
    const known = new Set(before.map((credential) => credential.Id));
    return {
        command: 'ADD_CREDENTIAL',
        data,
        isShown: (list) => list.some((one) => !known.has(one.Id) && isLike(one, wanted)),
        whyNot: (list) => `${nameOf(wanted)} was not stored: ${said(clashOf(wanted, list, null))}.`,
    };
}

export function edit(wanted: Credential): Change {
    return {
        command: 'EDIT_CREDENTIAL',
        data: wanted,
        isShown: (list) => {
            const now = byId(list, wanted.Id);
            return now !== undefined && isLike(now, wanted);
        },
        whyNot: (list) =>
            `${nameOf(wanted)} was not changed: ${byId(list, wanted.Id) ? UNKNOWN : 'it is not there any more'}.`,
    };
}

export function deletion(credential: Credential): Change {
    return {
        command: 'DELETE_CREDENTIAL',
        data: { Id: credential.Id },
        isShown: (list) => byId(list, credential.Id) === undefined,
        whyNot: () => `${nameOf(credential)} was not deleted: ${UNKNOWN}.`,
    };
}

export function move(credential: Credential, order: number): Change {
    const place = (list: readonly Credential[]) => list.findIndex((one) => one.Id === credential.Id);
    return {
        command: 'SET_POSITION_CREDENTIAL',
        data: { Id: credential.Id, Order: order },
        isShown: (list) => place(list) >= 0 && place(list) === Math.min(order, list.length - 1),
        whyNot: (list) =>
            place(list) < 0
                ? `${nameOf(credential)} was not moved: it is not there any more.`
                : `${nameOf(credential)} was not moved as asked: it is in position ${place(list) + 1}.`,
    };
}

/**
 * Sends it and waits for what comes of it. A refusal is not told: no list up to the point where the service has gone
 * past the command shows what was wanted. Other clients' lists may come in between.
 */
export async function carryOut(service: Service, change: Change): Promise<Result> {
    let isShown = false;
    const list = () => service.state.get().credentials ?? [];
    const stop = service.onEvent((event) => {
        if (event.id === 'GET_ALL_CREDENTIAL_LIST') isShown ||= change.isShown(list());
    });
    service.ask('hotspot', change.command, change.data);
    const isHandled = await handled(service);
    stop();
    if (isShown) return { isDone: true };
    return { isDone: false, why: isHandled ? change.whyNot(list()) : LOST };
}
