import { Checkpoint, isUp } from '../app/checkpoint';
import type { ServiceEvent } from '../app/protocol';
import type { Service } from '../app/service';
import type { Network } from '../app/state';

/** What has come of a request to join a network or to leave it. */
export type Outcome =
    | 'open'
    | 'joined'
    | 'refused' // every attempt was made and failed
    | 'notStarted'
    | 'left'
    | 'outOfRange'
    | 'overtaken' // another one was joined instead, as somebody else has asked for
    | 'radioOff'
    | 'adapterOut';

// A connection that nothing was told of counts once it was seen so long; so does a network that is missing.
const SETTLED = 900;

interface Result {
    isSuccess: boolean;
    /** The service had gone past the request. */
    isBehind: boolean;
    /** The report of an attempt; else the answer to a request that could not begin. */
    isReport: boolean;
}

class Lasting {
    #since: number | null = null;

    /** Whether it has held for long enough. */
    see(holds: boolean, now: number): boolean {
        if (!holds) this.#since = null;
        else this.#since ??= now;
        return this.#since !== null && now - this.#since >= SETTLED;
    }
}

/**
 * Follows a request that was sent. No event says whose it is, or which network it means: what is believed is the
 * list, and what comes behind the request. Fed with events; asks for lists at need.
 */
abstract class Judge {
    #results: Result[] = [];

    constructor(
        readonly network: string,
        private readonly checkpoint: Checkpoint,
        protected readonly askForList: () => void,
    ) {}

    /** `list`: the networks as they are known after the event. */
    take(event: ServiceEvent, list: readonly Network[]): Outcome {
        this.checkpoint.take(event);
        if (event.id === 'CARD_PLUG_OUT') return 'adapterOut';
        if (event.id === 'GET_RADIO' && event.data === false) return 'radioOff';
        if (event.id === 'CONNECT_DISCONNECT') {
            const isBehind = this.checkpoint.isPassed;
            this.#results.push({ isSuccess: event.data === 1, isBehind, isReport: false });
            this.askForList();
        } else if (event.id === 'GET_IS_INTERNET_ACCESS' && this.#results.length > 0) {
            this.#results.at(-1)!.isReport = true;
        } else if (event.id === 'GET_ALL_NETWORK_LIST') {
            const results = this.#results;
            this.#results = [];
            return this.judge(list, results, event.at);
        }
        return 'open';
    }

    protected abstract judge(list: readonly Network[], results: readonly Result[], now: number): Outcome;
}

export class JoinJudge extends Judge {
    #connected = new Lasting();
    #missing = new Lasting();
    #other = new Lasting();
    #isOtherTold = false;

    protected override judge(list: readonly Network[], results: readonly Result[], now: number): Outcome {
        const wanted = list.find((network) => network.name === this.network);
        const isConnected = wanted?.isConnected === true;
        const hasLasted = this.#connected.see(isConnected, now);
        const isMissing = this.#missing.see(!wanted, now);
        const isOvertaken = this.#seeOther(list, results, now);
        if (isConnected) return hasLasted || results.some((result) => result.isSuccess) ? 'joined' : 'open';
        for (const result of results) {
            const outcome = this.#failure(wanted !== undefined, result);
            if (outcome !== 'open') return outcome;
        }
        if (isMissing) return 'outOfRange';
        return isOvertaken ? 'overtaken' : 'open';
    }

    #seeOther(list: readonly Network[], results: readonly Result[], now: number): boolean {
        const isOther = list.some((network) => network.isConnected && network.name !== this.network);
        const isTold = results.some((result) => result.isSuccess && result.isBehind);
        this.#isOtherTold = isOther && (this.#isOtherTold || isTold);
        return this.#other.see(this.#isOtherTold, now);
    }

    // A report from before the service had come to the request is that of an attempt before; a bare answer from
    // behind it is to somebody else's request, unless the network has gone.
    #failure(isInList: boolean, { isSuccess, isReport, isBehind }: Result): Outcome {
        if (isSuccess) return 'open';
        if (isReport) return isBehind ? 'refused' : 'open';
        if (!isInList) return 'outOfRange';
        return isBehind ? 'open' : 'notStarted';
    }
}

/** The end of a connection brings a list by itself. */
export class LeaveJudge extends Judge {
    protected override judge(list: readonly Network[]): Outcome {
        const wanted = list.find((network) => network.name === this.network);
        return wanted?.isConnected ? 'open' : 'left';
    }
}

/** Sends the request, and gives what comes of it; `open` if nothing did within the limit, null if the service was lost. */
export function follow(service: Service, network: string, isJoin: boolean, limit: number): Promise<Outcome | null> {
    return new Promise((resolve) => {
        const askForList = () => service.ask('hotspot', 'GET_ALL_NETWORK_LIST');
        const end = (outcome: Outcome | null) => {
            stopEvents();
            stopState();
            clearInterval(asking);
            clearTimeout(timer);
            resolve(outcome);
        };
        const stopEvents = service.onEvent((event) => {
            const outcome = judge.take(event, service.state.get().networks ?? []);
            if (outcome !== 'open') end(outcome);
        });
        const stopState = service.state.subscribe(() => {
            if (!isUp(service)) end(null);
        });
        // Some outcomes are told by nothing but the list.
        const asking = setInterval(askForList, 1000);
        const timer = setTimeout(() => end('open'), limit);
        service.ask('hotspot', isJoin ? 'CONNECT_NETWORK' : 'DISCONNECT_NETWORK', { NetWorkName: network });
        const Kind = isJoin ? JoinJudge : LeaveJudge;
        // The first answer comes before an attempt can have ended, the second may come behind its end.
        const judge = new Kind(network, Checkpoint.behind(service, 1), askForList);
    });
}
