#pragma once

namespace CLI {
class App;
}

namespace vexa::client {

// Each adds its subcommand and the options of it to the parser. When the parser has selected it, its callback
// runs it and stores the exit code; what ends it early is thrown as ClientError.

void addStartCommand(CLI::App& app, int& exitCode);
void addDemoCommand(CLI::App& app, int& exitCode);

/// What there is on this kind of machine alone.
void addHostCommands(CLI::App& app, int& exitCode);

void addScanCommand(CLI::App& app, int& exitCode);
void addChannelsCommand(CLI::App& app, int& exitCode);
void addWatchCommand(CLI::App& app, int& exitCode);
void addSendCommand(CLI::App& app, int& exitCode);
void addListenCommand(CLI::App& app, int& exitCode);
void addCredentialsCommand(CLI::App& app, int& exitCode);
void addCredentialCommand(CLI::App& app, int& exitCode);
void addCredentialAdd(CLI::App& parent, int& exitCode);
void addCredentialEdit(CLI::App& parent, int& exitCode);
void addCredentialDelete(CLI::App& parent, int& exitCode);
void addCredentialExport(CLI::App& parent, int& exitCode);
void addCredentialImport(CLI::App& parent, int& exitCode);
void addCredentialList(CLI::App& parent, int& exitCode);
void addCredentialMove(CLI::App& parent, int& exitCode);
void addRecordCommand(CLI::App& app, int& exitCode);
void addPanelCommand(CLI::App& app, int& exitCode);
void addReloadCommand(CLI::App& app, int& exitCode);
void addLogCommand(CLI::App& app, int& exitCode);
void addScenarioCommand(CLI::App& app, int& exitCode);
void addStatsCommand(CLI::App& app, int& exitCode);
void addReplayCommand(CLI::App& app, int& exitCode);
void addStatusCommand(CLI::App& app, int& exitCode);
void addConnectCommand(CLI::App& app, int& exitCode);
void addDisconnectCommand(CLI::App& app, int& exitCode);
void addNetworksCommand(CLI::App& app, int& exitCode);
void addDoctorCommand(CLI::App& app, int& exitCode);
void addEnableCommand(CLI::App& app, int& exitCode);
void addDisableCommand(CLI::App& app, int& exitCode);
void addRefreshCommand(CLI::App& app, int& exitCode);
void addShellCommands(CLI::App& app, int& exitCode);

}  // namespace vexa::client
