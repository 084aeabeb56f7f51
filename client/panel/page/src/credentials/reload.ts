import { handled } from '../app/checkpoint';
import { notify } from '../app/notices';
import type { Service } from '../app/service';
import { counted } from '../app/text';

/** Makes the service read its configuration again, and tells what it has then. */
export async function reload(service: Service): Promise<void> {
    const before = JSON.stringify(service.state.get().credentials);
    service.ask('hotspot', 'READ_CREDENTIAL_FROM_FILE');
    service.ask('hotspot', 'GET_ALL_CREDENTIAL_LIST');
    if (!(await handled(service))) return void notify('The service was lost on the way.', { kind: 'failure' });
    const now = service.state.get().credentials ?? [];
    const told = before === JSON.stringify(now) ? 'Nothing has changed.' : 'They have changed.';
    notify(`Read again: ${counted(now.length, 'credential')}. ${told}`);
}
