/**
 * Where the scene's pieces sit for a target of width × height: the test
 * card's bars and ramp across the top, and under them the lower area with the
 * title, four cells for animated pieces, and (when the target has room) the
 * 320 × 240 panel of {@link TestCard2D} in the right half.
 */
final class DemoLayout {
    static final int PANEL_W = 320, PANEL_H = 240;
    static final int TITLE_H = 44, WAVE_H = 36;

    final int width, height;
    /** Bottom of the colour bars and of the grey ramp (both exclusive). */
    final int barsBottom, rampBottom;
    /** Top-left of the panel, or panelX < 0 when there is no room for it. */
    final int panelX, panelY;
    /** Right edge (exclusive) of the part of the lower area that the cells use. */
    final int cellsRight;
    /** Centres of the four cells and the radius that fits each. */
    final int[] cellX = new int[4], cellY = new int[4];
    final int cellRadius;

    DemoLayout(int width, int height) {
        this.width = width;
        this.height = height;
        barsBottom = height * 3 / 10;
        rampBottom = barsBottom + height / 12;
        int lowerH = height - rampBottom;
        if (width / 2 >= PANEL_W + 4 && lowerH >= PANEL_H + 8) {
            panelX = width / 2 + (width / 2 - PANEL_W) / 2;
            panelY = rampBottom + (lowerH - PANEL_H) / 2;
            cellsRight = width / 2;
        } else {
            panelX = panelY = -1;
            cellsRight = width;
        }
        int top = rampBottom + TITLE_H, bottom = Math.max(top + 16, height - WAVE_H);
        if (panelX >= 0) {  // 2 x 2 cells in the left half
            for (int i = 0; i < 4; i++) {
                cellX[i] = (2 * (i % 2) + 1) * cellsRight / 4;
                cellY[i] = top + (2 * (i / 2) + 1) * (bottom - top) / 4;
            }
            cellRadius = Math.max(6, Math.min(cellsRight / 4, (bottom - top) / 4) - 6);
        } else {  // one row of four
            for (int i = 0; i < 4; i++) {
                cellX[i] = (2 * i + 1) * cellsRight / 8;
                cellY[i] = (top + bottom) / 2;
            }
            cellRadius = Math.max(6, Math.min(cellsRight / 8, (bottom - top) / 2) - 6);
        }
    }
}
