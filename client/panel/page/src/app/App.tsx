import { CredentialsView } from '../credentials/CredentialsView';
import { NetworksView } from '../networks/NetworksView';
import { RecordView } from '../record/RecordView';
import { Transport } from '../record/Transport';
import { SpectrumView } from '../spectrum/SpectrumView';
import { Notices } from './notices';
import { ServiceContext } from './service';
import { shownSource, type Source } from './source';
import { StatusLine } from './StatusLine';
import { useStore } from './store';
import { TabList, useTab, type Tab } from './Tabs';
import { nextTheme, theme } from './theme';
import './base.css';
import './app.css';

const TABS: readonly Tab[] = [
    { id: 'spectrum', label: 'Spectrum' },
    { id: 'networks', label: 'Networks' },
    { id: 'credentials', label: 'Credentials' },
    { id: 'record', label: 'Record' },
];

const THEME_NAMES = { auto: 'Auto', light: 'Light', dark: 'Dark' };

function ThemeButton() {
    const chosen = useStore(theme, (value) => value);
    return (
        <button
            type="button"
            class="button quiet theme-button"
            onClick={nextTheme}
            title="Light, dark, or as the system is"
        >
            <span class="theme-word">Theme: </span>
            {THEME_NAMES[chosen]}
        </button>
    );
}

// Recordings are made of the live service, also while one is played. A view is there only while its tab is: what it has to keep lives outside of it.
function View({ tab, source, live }: { tab: string; source: Source; live: Source }) {
    switch (tab) {
        case 'networks':
            return <NetworksView />;
        case 'credentials':
            return <CredentialsView />;
        case 'record':
            return (
                <ServiceContext.Provider value={live.service}>
                    <RecordView />
                </ServiceContext.Provider>
            );
        default:
            return <SpectrumView key={source === live ? 'live' : 'played'} source={source} />;
    }
}

export function App({ live }: { live: Source }) {
    const [tab, choose] = useTab(TABS);
    const source = useStore(shownSource, (shown) => shown) ?? live;
    return (
        <ServiceContext.Provider value={source.service}>
            <header class="head">
                <h1 class="brand">Vexa</h1>
                <TabList tabs={TABS} current={tab} onChoose={choose} />
                <ThemeButton />
            </header>
            <StatusLine live={live.service} isLive={source === live} />
            <Transport />
            <main>
                <div class="view" id="view" role="tabpanel" aria-labelledby={`tab-${tab}`} tabIndex={-1}>
                    <View tab={tab} source={source} live={live} />
                </div>
            </main>
            <Notices />
        </ServiceContext.Provider>
    );
}
