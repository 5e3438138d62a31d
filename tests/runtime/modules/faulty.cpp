// tests/runtime/modules/faulty.cpp: a module that breaks its promises, one in each action.
#include "action.hpp"

#include <cstring>

namespace {

constexpr std::size_t row[] = {1, 3};
constexpr std::size_t rowBytes = 3 * sizeof(double);

unsigned char *bytesOf(const tsArray *array) {
    return static_cast<unsigned char *>(tsGetData(array));
}

tsArray *newRow() {
    return tsCreateUninitNumericArray(2, row, tsDOUBLE);
}

unsigned char *newBlock() {
    return static_cast<unsigned char *>(tsCalloc(16, 1));
}

void overrunBlock(const Call &) {
    unsigned char *const block = newBlock();
    block[16] = 1;
    tsFree(block);
}
void underrunBlock(const Call &) {
    unsigned char *const block = newBlock();
    block[-1] = 1;
    tsFree(block);
}
void overrunBlockLeft(const Call &) {
    newBlock()[16] = 1;
}
void overrunArray(const Call &call) {
    call.plhs[0] = newRow();
    bytesOf(call.plhs[0])[rowBytes] = 1;
}
void underrunArray(const Call &call) {
    call.plhs[0] = newRow();
    bytesOf(call.plhs[0])[-1] = 1;
}
void overrunArrayLeft(const Call &) {
    bytesOf(newRow())[rowBytes] = 1;
}
void overrunThenRaise(const Call &call) {
    overrunBlockLeft(call);
    tsxErrMsgIdAndTxt("test:raised", "Raised after the fault.");
}
void changeInput(const Call &call) {
    bytesOf(call.prhs[1])[0] ^= 1U;
}
void overrunInput(const Call &call) {
    bytesOf(call.prhs[1])[tsGetNumberOfElements(call.prhs[1]) * sizeof(double)] = 1;
}

void freeTwice(const Call &) {
    void *const block = newBlock();
    tsFree(block);
    tsFree(block);
}
void freeForeign(const Call &) {
    static double mine = 0;
    tsFree(&mine);
}
void freeData(const Call &call) {
    call.plhs[0] = newRow();
    tsFree(tsGetData(call.plhs[0]));
}

void leave(const Call &) {
    newBlock();
    newBlock();
    newRow();
    newRow();
    newRow();
}

void giveInput(const Call &call) {
    call.plhs[0] = const_cast<tsArray *>(call.prhs[1]);
}
void giveTwice(const Call &call) {
    call.plhs[0] = call.plhs[1] = newRow();
}
void giveCellsOwn(const Call &call) {
    tsArray *const value = newRow();
    call.plhs[0] = tsCreateCellArray(2, oneByOne);
    tsSetCell(call.plhs[0], 0, value);
    call.plhs[1] = value;
}
/// The value is gone when it is given: its cell has another one.
void giveReplaced(const Call &call) {
    giveCellsOwn(call);
    tsSetCell(call.plhs[0], 0, nullptr);
}

void cellOutOfRange(const Call &) {
    tsSetCell(tsCreateCellArray(2, oneByOne), 1, newRow());
}
void cellOfNumber(const Call &) {
    tsSetCell(newRow(), 0, newRow());
}
void cellValueTwice(const Call &) {
    tsArray *const value = newRow();
    tsArray *const cell = tsCreateCellArray(2, row);
    tsSetCell(cell, 0, value);
    tsSetCell(cell, 1, value);
}
void cellOfInput(const Call &call) {
    tsSetCell(tsCreateCellArray(2, oneByOne), 0, const_cast<tsArray *>(call.prhs[1]));
}
void cellIntoInput(const Call &call) {
    tsSetCell(const_cast<tsArray *>(call.prhs[1]), 0, newRow());
}
void cellItself(const Call &) {
    tsArray *const cell = tsCreateCellArray(2, oneByOne);
    tsSetCell(cell, 0, cell);
}
void cellCycle(const Call &) {
    tsArray *const outer = tsCreateCellArray(2, oneByOne);
    tsArray *const inner = tsCreateCellArray(2, oneByOne);
    tsSetCell(outer, 0, inner);
    tsSetCell(inner, 0, outer);
}

constexpr Action actions[] = {
    {"overrun_block", overrunBlock},
    {"underrun_block", underrunBlock},
    {"overrun_block_left", overrunBlockLeft},
    {"overrun_array", overrunArray},
    {"underrun_array", underrunArray},
    {"overrun_array_left", overrunArrayLeft},
    {"overrun_then_raise", overrunThenRaise},
    {"change_input", changeInput},
    {"overrun_input", overrunInput},
    {"free_twice", freeTwice},
    {"free_foreign", freeForeign},
    {"free_data", freeData},
    {"leave", leave},
    {"give_input", giveInput},
    {"give_twice", giveTwice},
    {"give_cells_own", giveCellsOwn},
    {"give_replaced", giveReplaced},
    {"cell_out_of_range", cellOutOfRange},
    {"cell_of_number", cellOfNumber},
    {"cell_value_twice", cellValueTwice},
    {"cell_of_input", cellOfInput},
    {"cell_into_input", cellIntoInput},
    {"cell_itself", cellItself},
    {"cell_cycle", cellCycle},
};

} // namespace

void tsxFunction(int /*nlhs*/, tsArray *plhs[], int nrhs, const tsArray *prhs[]) {
    runAction(actions, {plhs, nrhs, prhs});
}
