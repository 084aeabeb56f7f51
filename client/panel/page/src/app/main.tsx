import { render } from 'preact';
import { keepScan, RESUMED } from '../spectrum/scan';
import { SpectrumHistory } from '../spectrum/SpectrumHistory';
import { App } from './App';
import { Link } from './link';
import { notify } from './notices';
import { askWhenNeeded } from './questions';
import { Service } from './service';
import type { Source } from './source';
import { startTheme } from './theme';

function startLive(): Source {
    const service = new Service((port, message) => link.send(port, message));
    const spectrum = new SpectrumHistory();
    const link = new Link(`ws://${location.host}/socket`, {
        onState: (state) => service.takeLink(state),
        onEvent: (event) => service.takeEvent(event),
        onPanelMessage: (message) => {
            if (message.event === 'failure') notify(message.text, { kind: 'failure' });
            else service.takePanelMessage(message);
        },
    });
    service.onEvent((event) => spectrum.take(event));
    askWhenNeeded(service);
    const scan = keepScan(service, spectrum);
    scan.resumed.subscribe(() => scan.resumed.get() && notify(RESUMED));
    link.open();
    return { service, spectrum, now: () => performance.now(), epoch: performance.timeOrigin, scan };
}

startTheme();
const page = document.getElementById('page')!;
page.replaceChildren();
render(<App live={startLive()} />, page);
