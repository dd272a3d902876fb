// A 4-bit counter with enable and synchronous reset.
module counter (input clk, input rst, input en, output reg [3:0] q, output carry);
    always @(posedge clk)
        if (rst) q <= 4'd0;
        else if (en) q <= q + 4'd1;
    assign carry = en & (q == 4'hf);
endmodule
