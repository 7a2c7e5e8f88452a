#include "ZenEditor.h"

#include <QAbstractButton>
#include <QComboBox>
#include <QGridLayout>
#include <QGroupBox>
#include <QHBoxLayout>
#include <QLabel>
#include <QPushButton>
#include <QScrollArea>
#include <QScrollBar>
#include <QSignalBlocker>
#include <QStyle>
#include <QStyleFactory>
#include <QTimer>
#include <QVBoxLayout>
#include <algorithm>
#include <cstring>

#include "EditorDisplay.h"
#include "EditorLayoutRegistry.h"
#include "LevelBars.h"
#include "ParameterControl.h"

namespace {

// Controls per row of a group, and per row of groups.
constexpr int kGroupColumns = 6;
constexpr int kRowCells = 12;
// Beyond this many text lines (or average characters) the group area
// scrolls rather than growing the editor past a screen.
constexpr int kScrollLines = 40;
constexpr int kScrollCharacters = 200;
constexpr double kTitleScale = 1.35;  // the plug-in's name over the body text
// Hosts open an editor at its size hint: everything shown, within a screen.
constexpr int kMaxHintWidth = 1600;
constexpr int kMaxHintHeight = 1000;
const QColor kDimText(0x8a, 0x90, 0x99);

// Columns of a group's grid: rows as even as they can be, none wider than
// kGroupColumns (8 controls make two rows of 4, not 6 and 2).
int GroupColumns(std::size_t controls) {
    const std::size_t rows = (controls + kGroupColumns - 1) / kGroupColumns;
    return rows == 0 ? 1 : static_cast<int>((controls + rows - 1) / rows);
}

// A control's caption inside its group: "Gain" in "Channel 1", not
// "Channel 1 Gain".
QString CaptionIn(const QString& group, const std::string& label) {
    const QString text = QString::fromStdString(label);
    const QString prefix = group + QLatin1Char(' ');
    if (group.isEmpty() || !text.startsWith(prefix) || text.size() == prefix.size()) return text;
    return text.mid(prefix.size());
}

std::string Tail(const std::string& identifier) {
    const std::size_t colon = identifier.rfind("::");
    return colon == std::string::npos ? identifier : identifier.substr(colon + 2);
}

QPalette DarkPalette() {
    QPalette p;
    const QColor window(0x23, 0x26, 0x2b);
    const QColor base(0x17, 0x19, 0x1c);
    const QColor text(0xdc, 0xdf, 0xe4);
    const QColor dim = kDimText;
    const QColor button(0x31, 0x35, 0x3b);
    const QColor accent(0x4f, 0xa3, 0xd9);
    p.setColor(QPalette::Window, window);
    p.setColor(QPalette::WindowText, text);
    p.setColor(QPalette::Base, base);
    p.setColor(QPalette::AlternateBase, window);
    p.setColor(QPalette::Text, text);
    p.setColor(QPalette::PlaceholderText, dim);
    p.setColor(QPalette::Button, button);
    p.setColor(QPalette::ButtonText, text);
    p.setColor(QPalette::BrightText, QColor(0xf2, 0xf4, 0xf7));
    p.setColor(QPalette::Highlight, accent);
    p.setColor(QPalette::HighlightedText, QColor(0x10, 0x12, 0x14));
    p.setColor(QPalette::Mid, QColor(0x3c, 0x41, 0x48));
    p.setColor(QPalette::Dark, QColor(0x12, 0x14, 0x16));
    p.setColor(QPalette::Light, QColor(0x4a, 0x50, 0x58));
    p.setColor(QPalette::ToolTipBase, base);
    p.setColor(QPalette::ToolTipText, text);
    p.setColor(QPalette::Disabled, QPalette::WindowText, dim);
    p.setColor(QPalette::Disabled, QPalette::Text, dim);
    p.setColor(QPalette::Disabled, QPalette::ButtonText, dim);
    return p;
}

}  // namespace

struct ZenEditor::Layout {
    QByteArray className;
    std::vector<zen::ParameterInfo> parameters;
    std::vector<QString> groupOf;  // by parameter index
    QVBoxLayout* root = nullptr;
    QLabel* latency = nullptr;
    QPushButton* bypass = nullptr;
    QComboBox* presets = nullptr;
    std::vector<float> presetValues;  // parameters as the loaded preset left them
    QScrollArea* scroll = nullptr;
    QHBoxLayout* displayRow = nullptr;
    QWidget* groupArea = nullptr;
    QVBoxLayout* groupRows = nullptr;
    QHBoxLayout* currentRow = nullptr;
    int currentRowCells = 0;
    std::vector<EditorDisplay*> meterDisplays;
    std::uint32_t shownLatency = ~0u;
    float shownRate = 0.0f;
};

ZenEditor* ZenEditor::Create(const char* className, const QString& title, zen::EditorLink& link, QWidget* parent) {
    return new ZenEditor(className, title, link, nullptr, parent);
}

ZenEditor* ZenEditor::Create(const char* className, const QString& title, std::unique_ptr<zen::EditorLink> link,
                             QWidget* parent) {
    if (!link) return nullptr;
    zen::EditorLink& reference = *link;
    return new ZenEditor(className, title, reference, std::move(link), parent);
}

ZenEditor::ZenEditor(const char* className, const QString& title, zen::EditorLink& link,
                     std::unique_ptr<zen::EditorLink> ownedLink, QWidget* parent)
    : QWidget(parent), m_ownedLink(std::move(ownedLink)), m_link(&link), m_layout(std::make_unique<Layout>()) {
    m_layout->className = QByteArray(className != nullptr ? className : "");
    m_className = m_layout->className.constData();
    setObjectName(QString::fromUtf8(m_className));

    const std::uint32_t count = m_link->GetParameterCount();
    m_controls.assign(count, nullptr);
    m_layout->parameters.resize(count);
    m_layout->groupOf.resize(count);
    for (std::uint32_t i = 0; i < count; ++i) m_link->GetParameterInfo(i, m_layout->parameters[i]);

    setPalette(DarkPalette());
    setAutoFillBackground(true);

    m_layout->root = new QVBoxLayout(this);
    BuildHeader(title);
    m_layout->displayRow = new QHBoxLayout;
    m_layout->root->addLayout(m_layout->displayRow, 1);
    m_layout->groupArea = new QWidget;
    m_layout->groupRows = new QVBoxLayout(m_layout->groupArea);
    m_layout->groupRows->setContentsMargins(0, 0, 0, 0);

    m_timer = new QTimer(this);
    m_timer->setInterval(1000 / kDisplayRate);
    connect(m_timer, &QTimer::timeout, this, &ZenEditor::RefreshNow);

    if (const EditorLayoutRegistry::Function build = EditorLayoutRegistry::Find(m_className))
        build(*this);
    else
        BuildDefaultLayout();
    Finish();
}

ZenEditor::~ZenEditor() = default;

void ZenEditor::BuildHeader(const QString& title) {
    auto* header = new QHBoxLayout;
    auto* name = new QLabel(title);
    QFont big = name->font();
    if (big.pointSizeF() > 0.0)
        big.setPointSizeF(big.pointSizeF() * kTitleScale);
    else
        big.setPixelSize(static_cast<int>(big.pixelSize() * kTitleScale));
    big.setBold(true);
    name->setFont(big);
    header->addWidget(name);
    header->addStretch(1);

    const std::vector<std::string> presets = m_link->GetPresetNames();
    if (!presets.empty()) {
        m_layout->presets = new QComboBox;
        m_layout->presets->addItem(tr("Presets"));
        for (const std::string& preset : presets) m_layout->presets->addItem(QString::fromStdString(preset));
        m_layout->presets->setSizeAdjustPolicy(QComboBox::AdjustToContents);
        connect(m_layout->presets, QOverload<int>::of(&QComboBox::activated), this, [this](int item) {
            if (item <= 0) return;
            m_link->LoadPreset(m_layout->presets->itemText(item).toStdString());
            // After the refresh: a layout may derive parameters from the loaded ones.
            m_layout->presetValues.clear();
            RefreshNow();
            m_layout->presetValues.resize(m_layout->parameters.size());
            for (std::uint32_t i = 0; i < m_layout->presetValues.size(); ++i)
                m_layout->presetValues[i] = m_link->GetParameter(i);
        });
        header->addWidget(m_layout->presets);
    }
    if (m_link->HasAudio()) {
        m_layout->latency = new QLabel;
        // A fixed colour: some hosts' palettes drop roles a child inherits.
        QPalette dim = DarkPalette();
        dim.setColor(QPalette::WindowText, kDimText);
        m_layout->latency->setPalette(dim);
        header->addWidget(m_layout->latency);
        m_layout->bypass = new QPushButton(tr("Bypass"));
        m_layout->bypass->setCheckable(true);
        connect(m_layout->bypass, &QPushButton::toggled, this, [this](bool on) { m_link->SetBypass(on); });
        header->addWidget(m_layout->bypass);
    }
    m_layout->root->addLayout(header);
}

int ZenEditor::FindParameter(const char* name) const {
    if (name == nullptr) return -1;
    for (std::size_t i = 0; i < m_layout->parameters.size(); ++i) {
        const std::string& identifier = m_layout->parameters[i].identifier;
        if (identifier == name || Tail(identifier) == name) return static_cast<int>(i);
    }
    return -1;
}

int ZenEditor::FindMeter(const char* name) const {
    if (name == nullptr) return -1;
    zen::MeterInfo info;
    for (std::uint32_t i = 0; i < m_link->GetMeterCount(); ++i)
        if (m_link->GetMeterInfo(i, info) && (info.identifier == name || Tail(info.identifier) == name))
            return static_cast<int>(i);
    return -1;
}

void ZenEditor::PlaceGroup(QWidget* group, int cells) {
    if (m_layout->currentRow == nullptr || (m_layout->currentRowCells > 0 && m_layout->currentRowCells + cells > kRowCells)) {
        m_layout->currentRow = new QHBoxLayout;
        m_layout->currentRow->addStretch(1);
        m_layout->groupRows->addLayout(m_layout->currentRow);
        m_layout->currentRowCells = 0;
    }
    m_layout->currentRow->insertWidget(m_layout->currentRow->count() - 1, group, 0, Qt::AlignTop);
    m_layout->currentRowCells += cells;
}

void ZenEditor::AddGroup(const QString& title, std::initializer_list<const char*> parameters) {
    AddGroup(title, std::vector<std::string>(parameters.begin(), parameters.end()));
}

void ZenEditor::AddGroup(const QString& title, const std::vector<std::string>& parameters) {
    std::vector<std::uint32_t> indices;
    for (const std::string& name : parameters) {
        const int index = FindParameter(name.c_str());
        // Each parameter has one control: the first group that names it.
        if (index < 0 || m_controls[static_cast<std::size_t>(index)] != nullptr ||
            std::find(indices.begin(), indices.end(), static_cast<std::uint32_t>(index)) != indices.end())
            continue;
        indices.push_back(static_cast<std::uint32_t>(index));
    }
    PlaceControls(title, indices, GroupColumns(indices.size()));
}

void ZenEditor::PlaceControls(const QString& title, const std::vector<std::uint32_t>& indices, int cells) {
    if (indices.empty()) return;
    auto* box = new QGroupBox(title);
    auto* grid = new QGridLayout(box);
    const int columns = std::min(cells, GroupColumns(indices.size()));
    for (std::size_t i = 0; i < indices.size(); ++i) {
        ParameterControl* control = ParameterControl::Create(*m_link, indices[i], box);
        if (control == nullptr) continue;
        m_controls[indices[i]] = control;
        m_layout->groupOf[indices[i]] = title;
        control->SetCaption(CaptionIn(title, m_layout->parameters[indices[i]].label));
        grid->addWidget(control, static_cast<int>(i) / columns, static_cast<int>(i) % columns,
                        Qt::AlignHCenter | Qt::AlignTop);
    }
    PlaceGroup(box, cells);
}

void ZenEditor::AddDisplay(EditorDisplay* display, int stretch) {
    if (display == nullptr) return;
    m_layout->displayRow->addWidget(display, stretch);
    m_displays.push_back(display);
}

void ZenEditor::AddMeters(const QString& title, std::initializer_list<const char*> meters) {
    std::vector<std::string> names(meters.begin(), meters.end());
    if (LevelBars::Resolve(*m_link, names).empty()) return;
    auto* box = new QGroupBox(title);
    auto* column = new QVBoxLayout(box);
    auto* bars = new LevelBars(std::move(names), box);
    column->addWidget(bars);
    m_layout->meterDisplays.push_back(bars);
    bars->Refresh(*m_link);
    PlaceGroup(box, 2);
}

void ZenEditor::OnRefresh(std::function<void()> callback) {
    if (callback) m_refreshCallbacks.push_back(std::move(callback));
}

void ZenEditor::BuildDefaultLayout() {
    std::vector<std::uint32_t> all(m_controls.size());
    for (std::uint32_t i = 0; i < all.size(); ++i) all[i] = i;
    PlaceControls(tr("Parameters"), all, kRowCells);
    // Every level and value meter by its name, once per plug-in.
    std::vector<std::string> names;
    zen::MeterInfo info;
    for (std::uint32_t i = 0; i < m_link->GetMeterCount(); ++i)
        if (m_link->GetMeterInfo(i, info) &&
            (info.kind == zen::MeterKind::Level || info.kind == zen::MeterKind::Value))
            names.push_back(info.identifier);
    if (!names.empty()) {
        auto* box = new QGroupBox(tr("Meters"));
        auto* column = new QVBoxLayout(box);
        // Whole identifiers here: the layout is fixed to the channels the
        // editor met; a class layout names meters to follow channel changes.
        auto* bars = new LevelBars(std::move(names), box);
        column->addWidget(bars);
        m_layout->meterDisplays.push_back(bars);
        bars->Refresh(*m_link);
        PlaceGroup(box, 2);
    }
}

void ZenEditor::Finish() {
    // Parameters a layout left out still get a control.
    std::vector<std::uint32_t> left;
    for (std::uint32_t i = 0; i < m_controls.size(); ++i)
        if (m_controls[i] == nullptr) left.push_back(i);
    PlaceControls(tr("Other"), left, GroupColumns(left.size()));
    m_layout->groupRows->addStretch(1);
    if (m_displays.empty()) m_layout->root->setStretchFactor(m_layout->displayRow, 0);

    ApplyLook();
    const QSize need = m_layout->groupArea->sizeHint();
    const QFontMetrics metrics(font());
    if (need.height() > metrics.height() * kScrollLines || need.width() > metrics.averageCharWidth() * kScrollCharacters) {
        // Only the height scrolls: groups stay side by side as laid out.
        auto* scroll = new QScrollArea;
        scroll->setWidget(m_layout->groupArea);
        scroll->setWidgetResizable(true);
        scroll->setFrameShape(QFrame::NoFrame);
        scroll->setHorizontalScrollBarPolicy(Qt::ScrollBarAlwaysOff);
        scroll->setMinimumWidth(need.width() + scroll->verticalScrollBar()->sizeHint().width());
        scroll->setMinimumHeight(std::min(need.height(), metrics.height() * kScrollLines));
        scroll->setPalette(palette());
        scroll->viewport()->setAutoFillBackground(false);
        m_layout->root->addWidget(scroll, 1);
        m_layout->scroll = scroll;
    } else {
        m_layout->root->addWidget(m_layout->groupArea, m_displays.empty() ? 1 : 0);
    }
    RefreshNow();
}

void ZenEditor::ApplyLook() {
    // The editor keeps one look in every host, whatever the host's style and
    // application palette: each widget carries both itself rather than
    // inheriting them through a host's window.
    QStyle* style = QStyleFactory::create(QStringLiteral("Fusion"));
    if (style != nullptr) style->setParent(this);
    std::vector<QWidget*> widgets = {this, m_layout->groupArea};
    for (QWidget* root : {static_cast<QWidget*>(this), m_layout->groupArea})
        for (QWidget* child : root->findChildren<QWidget*>()) widgets.push_back(child);
    const QPalette look = DarkPalette();
    for (QWidget* widget : widgets) {
        if (style != nullptr) widget->setStyle(style);
        if (widget != m_layout->latency) widget->setPalette(look);
    }
}

QSize ZenEditor::sizeHint() const {
    QSize hint = QWidget::sizeHint();
    if (m_layout->scroll != nullptr) {
        // The whole group area rather than the scroll area's share of it.
        const QSize all = m_layout->groupArea->sizeHint();
        hint.rheight() += std::max(0, all.height() - m_layout->scroll->sizeHint().expandedTo(m_layout->scroll->minimumSize()).height());
        hint.rwidth() = std::max(hint.width(), all.width());
    }
    return {std::min(hint.width(), kMaxHintWidth), std::min(hint.height(), kMaxHintHeight)};
}

ParameterControl* ZenEditor::Control(std::uint32_t parameterIndex) const {
    return parameterIndex < m_controls.size() ? m_controls[parameterIndex] : nullptr;
}

QString ZenEditor::GroupOf(std::uint32_t parameterIndex) const {
    return parameterIndex < m_layout->groupOf.size() ? m_layout->groupOf[parameterIndex] : QString();
}

void ZenEditor::RefreshNow() {
    for (EditorDisplay* display : m_displays) display->Refresh(*m_link);
    for (EditorDisplay* display : m_layout->meterDisplays) display->Refresh(*m_link);
    for (const auto& callback : m_refreshCallbacks) callback();
    for (ParameterControl* control : m_controls)
        if (control != nullptr) control->SyncFromLink();

    if (m_layout->presets != nullptr) UpdatePresetCaption();

    if (m_layout->bypass != nullptr) {
        const QSignalBlocker blocker(m_layout->bypass);
        m_layout->bypass->setChecked(m_link->IsBypassed());
    }
    if (m_layout->latency != nullptr) {
        const std::uint32_t latency = m_link->GetLatency();
        const float rate = m_link->GetSampleRate();
        if (latency != m_layout->shownLatency || rate != m_layout->shownRate) {
            m_layout->shownLatency = latency;
            m_layout->shownRate = rate;
            const double ms = rate > 0.0f ? 1000.0 * latency / rate : 0.0;
            m_layout->latency->setText(latency == 0 ? tr("No latency")
                                                    : tr("Latency %1 samples (%2 ms)").arg(latency).arg(ms, 0, 'f', 1));
        }
    }
}

void ZenEditor::UpdatePresetCaption() {
    std::vector<float>& loaded = m_layout->presetValues;
    if (loaded.empty()) return;
    bool same = loaded.size() == m_layout->parameters.size();
    for (std::uint32_t i = 0; same && i < loaded.size(); ++i) same = m_link->GetParameter(i) == loaded[i];
    // Moved since the preset was loaded: back to the neutral caption.
    if (!same) {
        loaded.clear();
        const QSignalBlocker blocker(m_layout->presets);
        m_layout->presets->setCurrentIndex(0);
    }
}

QString ZenEditor::PresetCaption() const {
    return m_layout->presets != nullptr ? m_layout->presets->currentText() : QString();
}

bool ZenEditor::IsRefreshing() const { return m_timer->isActive(); }

void ZenEditor::showEvent(QShowEvent* event) {
    QWidget::showEvent(event);
    RefreshNow();
    m_timer->start();
}

void ZenEditor::hideEvent(QHideEvent* event) {
    m_timer->stop();
    QWidget::hideEvent(event);
}
