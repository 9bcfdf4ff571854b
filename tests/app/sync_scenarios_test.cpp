// Whole synchronizations: what lies on both sides before and after, and what the log says.
#include <map>
#include <ostream>

#include "tests/app/sync_fixture.h"

namespace orvane::testing {

namespace {

struct File {
    std::wstring name;
    std::string content;
    int seconds = 0;  // Written that long after noon.
};
using Contents = std::map<std::wstring, std::string>;

struct Scenario {
    const char* what;
    std::vector<File> pc;
    std::vector<File> device;
    std::vector<std::pair<std::wstring, std::wstring>> settings = {};
    const wchar_t* refuse = L"";  // Calls of the device.
    std::vector<int> answers = {};
    Contents to_pc = {};  // The files that are new or other afterwards.
    Contents to_device = {};
    Lines log = {};  // Between the first line and the last: "> name" to the device, "< name" to the PC.
};

void PrintTo(const Scenario& scenario, std::ostream* out) {
    *out << scenario.what;
}

const Scenario kScenarios[] = {
    {.what = "WhatIsNewOrNewerGoesBothWays",
     .pc = {{L"a.qvj", "pc"},
            {L"deep\\er\\Plan.XML", "plan"},
            {L"letter.doc", "of no type"},
            {L"newer.tn3", "newer", 10},
            {L"same.tn3", "on the pc", 9},
            {L"older.rd3", "older"}},
     .device = {{L"b.txt", "device"},
                {L"day 1\\scan.img", "image"},
                {L"NEWER.tn3", "older"},
                {L"older.rd3", "newer", 3600},
                {L"same.tn3", "on the device"}},
     .to_pc = {{L"b.txt", "device"}, {L"day 1\\scan.img", "image"}, {L"older.rd3", "newer"}},
     .to_device = {{L"a.qvj", "pc"}, {L"deep\\er\\Plan.XML", "plan"}, {L"NEWER.tn3", "newer"}},
     .log = {L"> a.qvj", L"> deep\\er\\Plan.XML", L"> newer.tn3", L"< b.txt", L"< day 1\\scan.img",
             L"< older.rd3"}},
    {.what = "WithoutOverwritingAndOfFewTypesOnlyWhatLacksIsCopied",
     .pc = {{L"a.qvj", "newer", 60}, {L"b.txt", "off"}, {L"c.IMG", "as bitmap"}},
     .device = {{L"a.qvj", "older"}, {L"d.img", "as bitmap"}},
     .settings = {{L"Overwrite_old_files", L"0"}, {L"Sync_txt_files", L"0"}, {L"Sync_img_files", L"0"}},
     .to_pc = {{L"d.img", "as bitmap"}},
     .to_device = {{L"c.IMG", "as bitmap"}},
     .log = {L"> c.IMG", L"< d.img"}},
    {.what = "CompanionFoldersComeAlong",
     .pc = {{L"bridge.wkf", "job"}, {L"bridge\\raw\\points.dat", "points"}},
     .device = {{L"tunnel.WKF", "job"}, {L"tunnel\\points.dat", "points"}},
     .to_pc = {{L"tunnel.WKF", "job"}, {L"tunnel\\points.dat", "points"}},
     .to_device = {{L"bridge.wkf", "job"}, {L"bridge\\raw\\points.dat", "points"}},
     .log = {L"> bridge.wkf", L"< tunnel.WKF"}},
    {.what = "BackupsAreNumberedOnBothSides",
     .pc = {{L"a.qvj", "newer", 60}, {L"b.qvj", "older"}},
     .device = {{L"a.qvj", "older"}, {L"a.qvj.001", "oldest"}, {L"b.qvj", "newer", 60}},
     .settings = {{L"Overwrite_bkp", L"1"}},
     .to_pc = {{L"b.qvj", "newer"}, {L"b.qvj.001", "older"}},
     .to_device = {{L"a.qvj", "newer"}, {L"a.qvj.002", "older"}},
     .log = {L"> a.qvj", L"< b.qvj"}},
    {.what = "AsksBeforeReplacing",
     .pc = {{L"a.qvj", "newer", 60},
            {L"b.qvj", "newer", 60},
            {L"letter.doc", "of no type, so of no question", 60},
            {L"new.qvj", "new"}},
     .device = {{L"a.qvj", "older"}, {L"b.qvj", "older"}, {L"letter.doc", "older"}},
     .settings = {{L"Overwrite_warn", L"1"}},
     .answers = {0, IDOK},  // The default button leaves the file as it is.
     .to_device = {{L"b.qvj", "newer"}, {L"new.qvj", "new"}},
     .log = {L"> b.qvj", L"> new.qvj"}},
    {.what = "AFailedFileDoesNotStopTheNext",
     .pc = {{L"a.qvj", "pc"}, {L"locked.qvj", "pc"}, {L"z.qvj", "pc"}},
     .device = {{L"b.txt", "device"}, {L"y.txt", "device"}},
     .refuse = L"CeCreateFile@\\Jobs\\a.qvj.orvane-part=5;CeCreateFile@\\Jobs\\b.txt=32",
     .to_pc = {{L"y.txt", "device"}},
     .to_device = {{L"z.qvj", "pc"}},
     // The lines of the failed files stay as they are, and no error text reaches the log.
     .log = {L"> a.qvj", L"> locked.qvj", L"> z.qvj", L"< b.txt", L"< y.txt"}},
    {.what = "NamesThatLeadElsewhereAreFiles",
     // What is left of these names without the extension leads out of the job folder, or to all of it.
     .pc = {{L"...wkf", "dots"}, {L".wkf", "dot"}, {L"points.dat", "of no type"}},
     .device = {},
     .to_device = {{L"...wkf", "dots"}, {L".wkf", "dot"}},
     .log = {L"> ...wkf", L"> .wkf"}},
};

// What the files of the folder hold.
Contents ContentsOf(const std::wstring& folder) {
    Contents contents;
    for (const std::wstring& name : ListTree(folder)) {
        if (!name.ends_with(L'\\')) {
            contents[name] = ReadTextFile(JoinPath(folder, name)).value_or("");
        }
    }
    return contents;
}

class SyncScenario : public SyncTest, public ::testing::WithParamInterface<Scenario> {};

TEST_P(SyncScenario, EndsAsItShould) {
    const Scenario& scenario = GetParam();
    for (const File& file : scenario.pc) {
        PutOnPc(file.name, file.seconds, file.content);
    }
    for (const File& file : scenario.device) {
        PutOnDevice(file.name, file.seconds, file.content);
    }
    for (const auto& [name, value] : scenario.settings) {
        Setting(name, value);
    }
    device_.Set(L"REFUSE", scenario.refuse);
    Contents pc = scenario.to_pc;  // With what lies there already and is to stay.
    Contents device = scenario.to_device;
    pc.merge(ContentsOf(pc_.Path()));
    device.merge(ContentsOf(device_.PcPath(L"\\Jobs")));
    UniqueFile lock(
        CreateFileW(OnPc(L"locked.qvj").c_str(), GENERIC_READ, 0, nullptr, OPEN_EXISTING, 0, nullptr));
    device_.StartTrace();
    const MessageBoxAnswerer boxes(scenario.answers);
    const SyncRun run;
    run.Synchronize();
    lock.Reset();

    Lines log = {L"Checking files..."};
    for (const std::wstring& line : scenario.log) {
        const bool to_device = line.starts_with(L'>');
        log.push_back((to_device ? L"[Desktop to Mobile Device]" : L"[Mobile Device to Desktop]") +
                      (L" File copy: \"\\" + line.substr(2) + L"\""));
    }
    log.push_back(L"Synchronization complete.");
    EXPECT_EQ(run.Log(), log);
    EXPECT_EQ(boxes.Seen().size(), scenario.answers.size());
    // The device is asked within sessions only, all of them closed, and for nothing beside the job folder.
    EXPECT_EQ(device_.CallsOf(L"CeRapiInitEx"), device_.CallsOf(L"CeRapiUninit"));
    for (const TraceLine& call : device_.Trace()) {
        EXPECT_TRUE(call.function == L"CeRapiUninit" || call.sessions > 0) << call.number;
        const std::wstring path = call.arguments.empty() ? L"" : call.arguments[0];
        EXPECT_TRUE(!path.starts_with(L'\\') || path.starts_with(L"\\Jobs") ||
                    path == L"\\CompareDateTime.txt")
            << call.number;
        EXPECT_FALSE(path.ends_with(L"\\..") || path.ends_with(L"\\points.dat.")) << call.number;
    }
    if (*scenario.refuse == L'\0' && scenario.answers.empty()) {
        run.Synchronize();  // Nothing is left to do, and the log goes on below.
        log.insert(log.end(), {L"Checking files...", L"Synchronization complete."});
        EXPECT_EQ(run.Log(), log);
    }
    EXPECT_EQ(ContentsOf(pc_.Path()), pc);
    EXPECT_EQ(ContentsOf(device_.PcPath(L"\\Jobs")), device);
}

INSTANTIATE_TEST_SUITE_P(App, SyncScenario, ::testing::ValuesIn(kScenarios),
                         [](const auto& each) { return each.param.what; });

}  // namespace

}  // namespace orvane::testing
