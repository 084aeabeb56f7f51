import { useService, useServiceState } from '../app/service';
import type { Credential, Network } from '../app/state';
import { openAddition } from '../credentials/dialogs';
import { METHOD_TLS } from '../credentials/matching';
import { nameOf, TYPE_CERTIFICATE, TYPE_USER } from '../credentials/words';
import { realmsText, whyNotAsked, type Request } from './requests';
import type { Attempt, LogStory } from './timeline';

interface Props {
    network: Network;
    fitting: readonly Credential[];
    credentials: readonly Credential[];
    story: LogStory | null;
    request: Request | null;
}

const ENDS = { running: 'under way', joined: 'joined', failed: 'not joined', ended: 'ended' };
const MOST_ATTEMPTS = 3;

/** What is in the way of the service joining it by itself, as far as it can be told. */
function reasonsOf({ network, fitting, credentials, story }: Props): string[] {
    if (network.isConnected) return [];
    const objection = whyNotAsked(network, credentials);
    if (objection) return [objection];
    const look = story?.looks.get(network.name);
    if (look && look.reasons.length > 0) return look.reasons;
    if (fitting.every((one) => !one.AutoConnect))
        return [`${fitting.map(nameOf).join(', ')}: not used without being asked.`];
    return story?.gate ? [`${story.gate.text} (${story.gate.at})`] : [];
}

function AttemptPart({ attempt }: { attempt: Attempt }) {
    return (
        <li>
            <p class="attempt-head">
                <span class="figures">{attempt.steps[0].at}</span> {attempt.isAsked ? 'asked for' : 'by itself'},{' '}
                <strong class={attempt.end === 'failed' ? 'bad' : ''}>{ENDS[attempt.end]}</strong>
            </p>
            <ol class="timeline">
                {attempt.steps.map((step, i) => (
                    <li key={i} class={step.mood}>
                        <time class="muted figures">{step.at.slice(-8)}</time> {step.text}
                    </li>
                ))}
            </ol>
        </li>
    );
}

function Attempts({ network, story }: Props) {
    const { isLive } = useService();
    const isOn = useServiceState((state) => state.log.on);
    const attempts = story?.attempts.filter((attempt) => attempt.network === network.name) ?? [];
    if (!isLive) return <p class="muted">A recording has no log, and only it knows how an attempt went.</p>;
    if (!isOn && attempts.length === 0)
        return (
            <p class="muted">
                The log is off, and only it knows how an attempt went. To turn it on, set{' '}
                <code>&lt;enabledump&gt;true&lt;/enabledump&gt;</code> in <code>config.xml</code> and start the service anew.
            </p>
        );
    if (attempts.length === 0)
        return <p class="muted">The log tells of none. The service writes it every 10 s.</p>;
    return (
        <ul class="attempts">
            {attempts
                .slice(-MOST_ATTEMPTS)
                .reverse()
                .map((attempt, i) => (
                    <AttemptPart key={attempts.length - i} attempt={attempt} />
                ))}
        </ul>
    );
}

function AddButton({ network, fitting }: Props) {
    const [realm] = network.realms;
    if (!realm || fitting.length > 0) return null;
    const type = realm.method === METHOD_TLS ? TYPE_CERTIFICATE : TYPE_USER;
    return (
        <button type="button" class="button small" onClick={() => openAddition({ RealName: realm.name, Type: type })}>
            Add a credential for it
        </button>
    );
}

/** Its realms, why it is not joined, and how the last attempts went. */
export function NetworkDetails(props: Props) {
    const { network, request } = props;
    const reasons = reasonsOf(props);
    return (
        <div class="network-details">
            {request?.text && <p class={request.state === 'failed' ? 'bad' : 'muted'}>{request.text}</p>}
            <h3>Realms</h3>
            <p>{realmsText(network)}</p>
            {!network.isConnected && (
                <>
                    <h3>Why it is not joined</h3>
                    {reasons.length === 0 ? (
                        <p class="muted">Nothing is known to be in the way.</p>
                    ) : (
                        <ul class="reasons">
                            {reasons.map((reason) => (
                                <li key={reason}>{reason}</li>
                            ))}
                        </ul>
                    )}
                    <AddButton {...props} />
                </>
            )}
            <h3>Attempts</h3>
            <Attempts {...props} />
        </div>
    );
}
