// A 4-bit ALU with registered result and flags: add, subtract, and, or, xor, shift left, shift
// right and pass, chosen by op; the zero and carry flags of the last result.
module alu (input clk, input [2:0] op, input [3:0] a, input [3:0] b,
            output reg [3:0] y, output reg zero, output reg carry);
    reg [4:0] r;
    always @(*)
        case (op)
            3'd0: r = a + b;
            3'd1: r = a - b;
            3'd2: r = {1'b0, a & b};
            3'd3: r = {1'b0, a | b};
            3'd4: r = {1'b0, a ^ b};
            3'd5: r = {a, 1'b0};
            3'd6: r = {a[0], 1'b0, a[3:1]};
            default: r = {1'b0, a};
        endcase
    always @(posedge clk) begin
        y <= r[3:0];
        zero <= r[3:0] == 4'd0;
        carry <= r[4];
    end
endmodule
